#pragma once

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"

namespace Glimmer {

// The plain text fill: the glyph coverage in one colour. Its opacity is not
// applied here; the stack applies the text's alpha when it composites.
class GxText : public GxECoreBase {
public:
    GxText();
    ~GxText() override;

    void setProperty(GxProperty* p) override;
    GxProperty* getProperty() override;
    void doPostProcessing(GxECore::ParamPostProcessing* pp) override;

private:
    GxTextProperty* property = nullptr;
};

}  // namespace Glimmer

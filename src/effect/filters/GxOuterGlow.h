#pragma once

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"
#include "effect/filters/GxGlowLayer.h"

namespace Glimmer {

// Kind 3: a soft coloured halo around the glyphs, drawn under the text. The
// passes are GxGlowLayer's on the glyph coverage, with a transparent frame.
class GxOuterGlow : public GxGlowLayer {
public:
    GxOuterGlow();

    // Keeps its own record and its own copy of the stops.
    void setProperty(GxProperty* p) override;
    void doPostProcessing(GxECore::ParamPostProcessing* p) override;
};

}  // namespace Glimmer

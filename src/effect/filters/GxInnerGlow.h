#pragma once

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"
#include "effect/filters/GxGlowLayer.h"

namespace Glimmer {

// Kind 4: light along the inside of the glyph edges. The passes are
// GxGlowLayer's on the inverted coverage, with an opaque white frame.
class GxInnerGlow : public GxGlowLayer {
public:
    GxInnerGlow();

    // Keeps its own record and its own copy of the stops.
    void setProperty(GxProperty* p) override;
    void doPostProcessing(GxECore::ParamPostProcessing* p) override;
};

}  // namespace Glimmer

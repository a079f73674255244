#pragma once

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"
#include "effect/filters/GxGradientLayer.h"

namespace Glimmer {

// Kind 8: the glyph box filled in rings around its centre.
//
// A pixel's index is trunc((2 * 256 / W / scale) * sqrt(dy^2 + dx^2)),
// limited to 0..255, with (dx, dy) its offset from the box centre (W/2, H/2),
// all in single precision. Entry 0 is the centre; the table's end is reached
// about W * scale / 2 away. The ring spacing follows the box width only, tall
// boxes included: deliberate.
class GxRadialGradient : public GxGradientLayer {
public:
    GxRadialGradient();

    // Keeps its own record and its own copy of the stops.
    void setProperty(GxProperty* p) override;
    void doPostProcessing(GxECore::ParamPostProcessing* p) override;
};

}  // namespace Glimmer

#pragma once

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"
#include "effect/filters/GxGradientLayer.h"

namespace Glimmer {

// Kind 7: the glyph box filled along a direction.
//
// The angle is turned into radians with the sign reversed (y grows
// downwards, so 90 degrees runs upwards) by the constant 0.01745328. The
// gradient line through the box centre leaves the box through its left and
// right sides when |tan a| < H / W, and then spans L = W / |cos a|; otherwise
// L = H / |sin a|. The whole table covers L / scale pixels along the line,
// centred on the box: a pixel's index is
//     clamp(trunc(v * (y - H/2) + u * (x - W/2)), -128, 127) + 128
// with (u, v) = (cos a, sin a) * 256 / scale / L, all in single precision.
// Entry 256 is never used.
class GxLinearGradient : public GxGradientLayer {
public:
    GxLinearGradient();

    // Keeps its own record and its own copy of the stops.
    void setProperty(GxProperty* p) override;
    void doPostProcessing(GxECore::ParamPostProcessing* p) override;
};

}  // namespace Glimmer

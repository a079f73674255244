#pragma once
// Geometry shared by the outer and the inner shadow: how far the shadow is
// moved for a light angle and distance, and the blur radius of a size. Both
// shadows must agree on these to the pixel, so they live here once.

#include <cstdint>

namespace Glimmer {

struct ShadowDisplacement {
    int32_t dx = 0;  // pixels, positive to the right
    int32_t dy = 0;  // pixels, positive downward
};

// Half away from zero (+0.5 above zero, -0.5 otherwise, then truncation).
// Clamped to +-kMaxShadowDisplacement first; NaN gives 0.
int32_t RoundShadowOffset(float v);

// Angle in degrees, distance in pixels. a = angle * 3.14159 / 180 (that
// constant, not the full pi: the offsets have always been computed with it),
// dx = distance * -cos a, dy = distance * sin a, each rounded half away from
// zero. Angle 0 moves the shadow to the left, 90 downward.
ShadowDisplacement ComputeShadowDisplacement(float angleDegrees, float distance);

// Blur radius of a size: trunc(size + 0.5) with the sum in single precision,
// saturated to int32 (NaN gives 0). May be negative for negative sizes; the
// callers decide what that means.
int32_t ShadowRadiusSingle(float size);

// The same with the sum in double precision, and never below 0.
int32_t ShadowRadiusDouble(float size);

}  // namespace Glimmer

#include "effect/filters/GxShadowGeometry.h"

#include <math.h>  // sincosf

#include "effect/GxEffectMath.h"
#include "effect/filters/GxFilterLimits.h"

namespace Glimmer {

int32_t RoundShadowOffset(float v) {
    if (!(v == v)) return 0;
    if (v > kMaxShadowDisplacement) v = kMaxShadowDisplacement;
    if (v < -kMaxShadowDisplacement) v = -kMaxShadowDisplacement;
    return static_cast<int32_t>(v > 0.0f ? v + 0.5f : v - 0.5f);
}

ShadowDisplacement ComputeShadowDisplacement(float angleDegrees, float distance) {
    float a = angleDegrees * 3.14159f / 180.0f;
    float s = 0.0f;
    float c = 0.0f;
    ::sincosf(a, &s, &c);
    ShadowDisplacement d;
    d.dx = RoundShadowOffset(distance * -c);
    d.dy = RoundShadowOffset(distance * s);
    return d;
}

int32_t ShadowRadiusSingle(float size) { return EffectMath::TruncToInt(size + 0.5f); }

int32_t ShadowRadiusDouble(float size) {
    double v = double(size) + 0.5;
    if (!(v >= 1.0)) return 0;  // also NaN
    if (v >= 2147483648.0) return INT32_MAX;
    return static_cast<int32_t>(v);
}

}  // namespace Glimmer

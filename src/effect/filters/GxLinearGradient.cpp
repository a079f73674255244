#include "effect/filters/GxLinearGradient.h"

#include <cmath>
#include <new>

#include "effect/GxEffectMath.h"

namespace Glimmer {

GxLinearGradient::GxLinearGradient() { style = GxECore::kLinearGradient; }

void GxLinearGradient::setProperty(GxProperty* p) {
    auto* source = dynamic_cast<GxLinearGradientProperty*>(p);
    if (source == nullptr) return;
    replaceProperty(new (std::nothrow) GxLinearGradientProperty(
        source->angle, source->scale, source->opacity, source->count, source->stops));
}

void GxLinearGradient::doPostProcessing(GxECore::ParamPostProcessing* p) {
    Fill fill;
    if (!beginFill(p, &fill)) return;
    const float w = float(fill.width), h = float(fill.height);
    const float a = property->angle * -0.01745328f;
    // A real division: the box's aspect, not an integer ratio.
    const float length = std::fabs(std::tan(a)) < h / w ? w / std::fabs(std::cos(a))
                                                         : h / std::fabs(std::sin(a));
    const float k = 256.0f / property->scale / length;
    const float u = std::cos(a) * k;
    const float v = std::sin(a) * k;
    const float halfW = w * 0.5f, halfH = h * 0.5f;

    for (int32_t y = 0; y < fill.height; ++y) {
        const unsigned char* m = fill.MaskRow(y);
        uint32_t* out = fill.ImageRow(y);
        const float along = v * (float(y) - halfH);
        for (int32_t x = 0; x < fill.width; ++x) {
            if (m[x] == 0) continue;
            const float t = along + u * (float(x) - halfW);
            out[x] = fill.table[EffectMath::ClampInt(EffectMath::TruncToInt(t), -128, 127) + 128];
        }
    }
    endFill(p, &fill);
}

}  // namespace Glimmer

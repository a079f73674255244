#include "effect/filters/GxRadialGradient.h"

#include <cmath>
#include <new>

#include "effect/GxEffectMath.h"

namespace Glimmer {

GxRadialGradient::GxRadialGradient() { style = GxECore::kRadialGradient; }

void GxRadialGradient::setProperty(GxProperty* p) {
    auto* source = dynamic_cast<GxRadialGradientProperty*>(p);
    if (source == nullptr) return;
    replaceProperty(new (std::nothrow) GxRadialGradientProperty(
        source->angle, source->scale, source->opacity, source->count, source->stops));
}

void GxRadialGradient::doPostProcessing(GxECore::ParamPostProcessing* p) {
    Fill fill;
    if (!beginFill(p, &fill)) return;
    const float w = float(fill.width), h = float(fill.height);
    // A real division: 512 / W is fractional for most widths.
    const float rings = 2.0f * 256.0f / w / property->scale;
    const float halfW = w * 0.5f, halfH = h * 0.5f;

    for (int32_t y = 0; y < fill.height; ++y) {
        const unsigned char* m = fill.MaskRow(y);
        uint32_t* out = fill.ImageRow(y);
        const float dy = float(y) - halfH;
        const float dy2 = dy * dy;
        for (int32_t x = 0; x < fill.width; ++x) {
            if (m[x] == 0) continue;
            const float dx = float(x) - halfW;
            const float d = rings * std::sqrt(dy2 + dx * dx);
            out[x] = fill.table[EffectMath::ClampInt(EffectMath::TruncToInt(d), 0, 255)];
        }
    }
    endFill(p, &fill);
}

}  // namespace Glimmer

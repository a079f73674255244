#include "effect/LayerFactory.h"

#include <new>

#include "effect/GxText.h"
#include "effect/filters/GxBevel.h"
#include "effect/filters/GxEmboss.h"
#include "effect/filters/GxInnerGlow.h"
#include "effect/filters/GxInnerShadow.h"
#include "effect/filters/GxLinearGradient.h"
#include "effect/filters/GxOuterGlow.h"
#include "effect/filters/GxOuterShadow.h"
#include "effect/filters/GxPattern.h"
#include "effect/filters/GxRadialGradient.h"
#include "effect/filters/GxStroke.h"

namespace Glimmer {

GxECoreBase* CreateEffectLayer(int kind) {
    switch (kind) {
        case GxECore::kOuterShadow: return new (std::nothrow) GxOuterShadow();
        case GxECore::kInnerShadow: return new (std::nothrow) GxInnerShadow();
        case GxECore::kOuterGlow: return new (std::nothrow) GxOuterGlow();
        case GxECore::kInnerGlow: return new (std::nothrow) GxInnerGlow();
        case GxECore::kBevel: return new (std::nothrow) GxBevel();
        case GxECore::kEmboss: return new (std::nothrow) GxEmboss();
        case GxECore::kLinearGradient: return new (std::nothrow) GxLinearGradient();
        case GxECore::kRadialGradient: return new (std::nothrow) GxRadialGradient();
        case GxECore::kStroke: return new (std::nothrow) GxStroke();
        case GxECore::kPattern: return new (std::nothrow) GxPattern();
        case GxECore::kText: return new (std::nothrow) GxText();
        default: return nullptr;  // 9 is reserved: no layer class
    }
}

}  // namespace Glimmer

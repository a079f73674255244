#include "effect/filters/GxInnerGlow.h"

#include <new>

namespace Glimmer {

GxInnerGlow::GxInnerGlow() { style = GxECore::kInnerGlow; }

void GxInnerGlow::setProperty(GxProperty* p) {
    auto* source = dynamic_cast<GxInnerGlowProperty*>(p);
    if (source == nullptr) return;
    replaceProperty(new (std::nothrow) GxInnerGlowProperty(source->size, source->color, source->opacity,
                                                           source->count, source->stops));
}

void GxInnerGlow::doPostProcessing(GxECore::ParamPostProcessing* p) { drawGlow(p, Side::kInner); }

}  // namespace Glimmer

#include "effect/filters/GxOuterGlow.h"

#include <new>

namespace Glimmer {

GxOuterGlow::GxOuterGlow() { style = GxECore::kOuterGlow; }

void GxOuterGlow::setProperty(GxProperty* p) {
    auto* source = dynamic_cast<GxOuterGlowProperty*>(p);
    if (source == nullptr) return;
    replaceProperty(new (std::nothrow) GxOuterGlowProperty(source->size, source->color, source->opacity,
                                                           source->count, source->stops));
}

void GxOuterGlow::doPostProcessing(GxECore::ParamPostProcessing* p) { drawGlow(p, Side::kOuter); }

}  // namespace Glimmer

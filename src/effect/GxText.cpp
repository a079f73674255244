#include "effect/GxText.h"

#include <new>

#include "effect/GxBlender.h"

namespace Glimmer {

GxText::GxText() { style = GxECore::kText; }

GxText::~GxText() { delete property; }

void GxText::setProperty(GxProperty* p) {
    if (p == nullptr) return;
    // Only the colour and opacity every record carries are needed.
    auto* copy = new (std::nothrow) GxTextProperty(p->color, p->opacity);
    if (copy == nullptr) return;
    delete property;
    property = copy;
}

GxProperty* GxText::getProperty() { return property; }

void GxText::doPostProcessing(GxECore::ParamPostProcessing* pp) {
    if (pp == nullptr || property == nullptr || pp->dst == nullptr || pp->src == nullptr) return;
    // With a work image, the coverage is only an on/off switch here (the
    // final merge applies it); alone, the coverage is the text's alpha and
    // scales whatever partially covered pixels already hold.
    const int mode = pp->separateWorkImage == 1 ? GxE_BLEND_DST_OVER_NSA : GxE_BLEND_OTHER;
    const GxBitmap* mask = pp->src;
    GxBlender::drawBitmapBlend8(0, 0, pp->dst, mask->pixels, int(mask->width), int(mask->height),
                                int(mask->width), property->color, mode);
}

}  // namespace Glimmer

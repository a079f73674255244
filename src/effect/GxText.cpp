#include "effect/GxText.h"

#include <algorithm>
#include <cstdint>
#include <new>

#include "effect/GxBlender.h"

namespace Glimmer {

GxText::GxText() { style = GxECore::kText; }

GxText::~GxText() { delete property; }

void GxText::setProperty(GxProperty* p) {
    if (p == nullptr) return;
    // Only the colour and opacity every record carries are needed. The text
    // object sets them before every render, so the record is kept and
    // overwritten.
    if (property != nullptr) {
        *property = GxTextProperty(p->color, p->opacity);
        return;
    }
    property = new (std::nothrow) GxTextProperty(p->color, p->opacity);
}

GxProperty* GxText::getProperty() { return property; }

void GxText::doPostProcessing(GxECore::ParamPostProcessing* pp) {
    if (pp == nullptr || property == nullptr || pp->dst == nullptr || pp->src == nullptr) return;
    // With a work image, the coverage is only an on/off switch here (the
    // final merge applies it); alone, the coverage is the text's alpha and
    // scales whatever partially covered pixels already hold.
    const int mode = pp->separateWorkImage == 1 ? GxE_BLEND_DST_OVER_NSA : GxE_BLEND_OTHER;
    const GxBitmap* mask = pp->src;
    // Both blends leave the destination as it is where the coverage is 0, and
    // the stack draws every glyph inside the glyph box: the box alone gives
    // the picture of the whole mask.
    int64_t left = 0, top = 0, right = mask->width, bottom = mask->height;
    if (pp->textRect != nullptr && mask->pixels != nullptr) {
        left = std::clamp<int64_t>(pp->textRect->left, 0, right);
        top = std::clamp<int64_t>(pp->textRect->top, 0, bottom);
        right = std::clamp<int64_t>(pp->textRect->right, left, right);
        bottom = std::clamp<int64_t>(pp->textRect->bottom, top, bottom);
    }
    const unsigned char* corner =
        mask->pixels != nullptr ? mask->pixels + size_t(top) * mask->width + size_t(left) : nullptr;
    GxBlender::drawBitmapBlend8(int(left), int(top), pp->dst, corner, int(right - left), int(bottom - top),
                                int(mask->width), property->color, mode);
}

}  // namespace Glimmer

#include "effect/filters/GxGradientLayer.h"

#include "effect/GxBlender.h"

namespace Glimmer {

GxGradientLayer::~GxGradientLayer() { delete property; }

GxProperty* GxGradientLayer::getProperty() { return property; }

void GxGradientLayer::replaceProperty(GxLinearGradientProperty* copy) {
    if (copy != nullptr && !copy->copyStops()) {
        delete copy;
        copy = nullptr;
    }
    delete property;
    property = copy;
}

bool GxGradientLayer::beginFill(GxECore::ParamPostProcessing* p, Fill* fill) {
    if (p == nullptr || property == nullptr || !(property->scale >= 0.1f) || p->textRect == nullptr ||
        p->dst == nullptr || p->src == nullptr || property->stops == nullptr)
        return false;
    if (!ClipBoxToMask(*p->textRect, *p->src, &fill->box)) return false;
    fill->width = fill->box.right - fill->box.left;
    fill->height = fill->box.bottom - fill->box.top;
    if (!BuildGradientTable(fill->table, property->stops, property->count)) return false;
    for (uint32_t& entry : fill->table) entry = PremultiplyColor(entry);
    const size_t pixels = size_t(fill->width) * size_t(fill->height);
    if (p->scratch != nullptr) {
        fill->image = p->scratch->get<uint32_t>(GxScratch::kPlaneA, pixels, true);
    } else {
        fill->ownImage = AllocateWork<uint32_t>(pixels, true);
        fill->image = fill->ownImage.get();
    }
    if (fill->image == nullptr) return false;
    fill->maskStride = p->src->width;
    fill->mask = p->src->pixels + size_t(fill->box.top) * fill->maskStride + size_t(fill->box.left);
    return true;
}

void GxGradientLayer::endFill(GxECore::ParamPostProcessing* p, Fill* fill) {
    GxBlender::drawBitmapBlend32(fill->box.left, fill->box.top, p->dst, fill->image, fill->width,
                                 fill->height, fill->width, GxE_BLEND_DST_OVER);
    fill->image = nullptr;
    fill->ownImage.reset();
}

}  // namespace Glimmer

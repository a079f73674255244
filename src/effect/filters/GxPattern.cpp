#include "effect/filters/GxPattern.h"

#include <cmath>
#include <new>

#include "effect/GxBlender.h"
#include "effect/GxEffectMath.h"
#include "effect/filters/GxLayerSupport.h"

namespace Glimmer {

using EffectMath::TruncToInt;

namespace {

// Where one output row or column samples the tile: the texel, its wrapped
// neighbour and the 8-bit weight of the neighbour.
struct Sample {
    int32_t index = 0;
    int32_t next = 0;
    uint32_t weight = 0;
};

// Position `pos` (0, 1, 2, ... along the box) on a tile of `texels` texels
// scaled to `tiled` pixels.
Sample SampleAt(int32_t pos, int32_t tiled, int32_t texels, float scale) {
    // A tile scaled below one pixel has no period of its own; such positions
    // run on unreduced and are folded back onto the tile below.
    const float at = float(tiled > 0 ? pos % tiled : pos) / scale;
    const float whole = std::floor(at);
    Sample s;
    s.weight = uint32_t(EffectMath::ClampInt(TruncToInt((at - whole) * 255.0f), 0, 255));
    int32_t index = TruncToInt(whole);
    // Rounding can only reach `texels` for huge tiles; never read past the tile.
    if (index < 0 || index >= texels) index = index < 0 ? 0 : index % texels;
    s.index = index;
    s.next = index + 1 >= texels ? 0 : index + 1;
    return s;
}

}  // namespace

GxPattern::GxPattern() { style = GxECore::kPattern; }

GxPattern::~GxPattern() {
    delete property;
    delete tile;
}

void GxPattern::setProperty(GxProperty* p) {
    auto* source = dynamic_cast<GxPatternProperty*>(p);
    if (source == nullptr) return;
    auto* copy = new (std::nothrow) GxPatternProperty(nullptr, source->scale, source->opacity);
    GxBitmap* ownTile = nullptr;
    if (copy != nullptr && source->tile != nullptr) {
        ownTile = new (std::nothrow) GxBitmap(*source->tile);
        // A tile whose pixels could not be copied is no copy: drop the record.
        if (ownTile == nullptr || (ownTile->pixels == nullptr && source->tile->pixels != nullptr)) {
            delete ownTile;
            delete copy;
            ownTile = nullptr;
            copy = nullptr;
        }
    }
    if (copy != nullptr) copy->tile = ownTile;
    delete property;
    delete tile;
    property = copy;
    tile = ownTile;
}

GxProperty* GxPattern::getProperty() { return property; }

void GxPattern::doPostProcessing(GxECore::ParamPostProcessing* p) {
    if (property == nullptr || !(property->scale >= 0.1f)) return;
    if (p == nullptr || p->textRect == nullptr || p->dst == nullptr || p->src == nullptr) return;
    if (tile == nullptr || tile->pixels == nullptr || tile->bytesPerPixel != 4 || tile->width == 0 ||
        tile->height == 0 || tile->width > uint32_t(INT32_MAX) || tile->height > uint32_t(INT32_MAX))
        return;
    GxRect box;
    if (!ClipBoxToMask(*p->textRect, *p->src, &box)) return;
    const int32_t W = box.right - box.left, H = box.bottom - box.top;
    const int32_t bw = int32_t(tile->width), bh = int32_t(tile->height);
    const float scale = property->scale;
    const int32_t tw = TruncToInt(scale * float(bw));
    const int32_t th = TruncToInt(scale * float(bh));

    // Work memory: the stack's when it lends it, else our own for this call.
    WorkBuffer<uint32_t> ownImage;
    WorkBuffer<Sample> ownColumns;
    uint32_t* image = nullptr;
    Sample* columns = nullptr;
    if (p->scratch != nullptr) {
        image = p->scratch->get<uint32_t>(GxScratch::kPlaneA, size_t(W) * size_t(H), true);
        columns = p->scratch->get<Sample>(GxScratch::kRows, size_t(W));
    } else {
        ownImage = AllocateWork<uint32_t>(size_t(W) * size_t(H), true);
        ownColumns = AllocateWork<Sample>(size_t(W));
        image = ownImage.get();
        columns = ownColumns.get();
    }
    if (image == nullptr || columns == nullptr) return;
    for (int32_t x = 0; x < W; ++x) columns[x] = SampleAt(x, tw, bw, scale);

    const float opacity = property->opacity;
    const size_t tileStride = size_t(bw) * 4;
    for (int32_t y = 0; y < H; ++y) {
        const Sample row = SampleAt(y, th, bh, scale);
        const unsigned char* upper = tile->pixels + size_t(row.index) * tileStride;
        const unsigned char* lower = tile->pixels + size_t(row.next) * tileStride;
        const uint32_t fy = row.weight;
        const unsigned char* m = p->src->pixels + size_t(box.top + y) * p->src->width + size_t(box.left);
        uint32_t* out = image + size_t(y) * size_t(W);
        for (int32_t x = 0; x < W; ++x) {
            if (m[x] == 0) continue;
            const Sample& col = columns[x];
            const uint32_t fx = col.weight;
            const unsigned char* t00 = upper + size_t(col.index) * 4;
            const unsigned char* t10 = upper + size_t(col.next) * 4;
            const unsigned char* t01 = lower + size_t(col.index) * 4;
            const unsigned char* t11 = lower + size_t(col.next) * 4;
            uint32_t value[4];
            for (int b = 0; b < 4; ++b) {
                const uint32_t top = t00[b] * (255 - fx) + t10[b] * fx;
                const uint32_t bottom = t01[b] * (255 - fx) + t11[b] * fx;
                value[b] = ((top * (255 - fy) + bottom * fy) >> 16) & 0xFF;  // / 65536: deliberate
            }
            const uint32_t alpha =
                uint32_t(EffectMath::ClampInt(TruncToInt(opacity * float(value[0])), 0, 255));
            uint32_t word = alpha << 24;
            for (int b = 1; b < 4; ++b) {
                const uint32_t c = ((value[b] + 1) * alpha) >> 8;
                word |= (c > 255 ? 255 : c) << (8 * (3 - b));
            }
            out[x] = word;
        }
    }
    GxBlender::drawBitmapBlend32(box.left, box.top, p->dst, image, W, H, W, GxE_BLEND_DST_OVER);
}

}  // namespace Glimmer

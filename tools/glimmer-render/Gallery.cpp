// The contact sheet. Each cell is one render of the sample text, exactly as
// a single render on the command line would produce it (its own text object,
// its own margins), centred in a white card with its label below. Cards are
// sized to the largest sample so the grid stays regular.

#include "Gallery.h"

#include <algorithm>

#include "Effects.h"
#include "Renderer.h"
#include "Values.h"

namespace Glimmer::RenderTool {
namespace {

constexpr int kColumns = 4;
constexpr float kSampleSize = 56.0f;
constexpr float kLabelSize = 15.0f;
constexpr float kTitleSize = 26.0f;
constexpr int kGap = 16;           // between cards and around the sheet
constexpr int kInset = 12;         // inside a card
constexpr uint32_t kSheetColor = 0xFFE3E7EDu;
constexpr uint32_t kCardColor = 0xFFFFFFFFu;
constexpr uint32_t kLabelColor = 0xFF3C4452u;
constexpr const char* kDrawnTile = "(drawn)";

// Diagonal stripes in two warm colours, 12 pixels a period.
Image StripeTile() {
    Image tile(12, 12);
    for (int y = 0; y < tile.height; ++y) {
        for (int x = 0; x < tile.width; ++x) tile.At(x, y) = (x + y) % 12 < 6 ? 0xFFE4572Eu : 0xFFFFC914u;
    }
    return tile;
}

RenderRequest Request(const std::string& text, const std::string& fontPath, float size) {
    RenderRequest request;
    request.text = text;
    request.fontPath = fontPath;
    request.size = size;
    return request;
}

Image Label(const std::string& text, const std::string& fontPath, float size, uint32_t color) {
    RenderRequest request = Request(text, fontPath, size);
    request.effects.push_back(ParseEffect("text:color=" + FormatColor(color)));
    return Render(request).image;
}

void Fill(Image* canvas, int x, int y, int width, int height, uint32_t color) {
    for (int row = std::max(y, 0); row < std::min(y + height, canvas->height); ++row) {
        for (int column = std::max(x, 0); column < std::min(x + width, canvas->width); ++column) {
            canvas->At(column, row) = color;
        }
    }
}

}  // namespace

const std::vector<GalleryCell>& GalleryCells() {
    static const std::vector<GalleryCell> cells = {
        {"text", {"text:color=#2B3A55"}},
        {"stroke, outside", {"text:color=#FFFFFF", "stroke:size=4,color=#D7263D,position=outside"}},
        {"stroke, center", {"text:color=#FFD23F", "stroke:size=4,color=#1B1B3A,position=center"}},
        {"stroke, inside", {"text:color=#A3D5FF", "stroke:size=4,color=#1D5C8C,position=inside"}},
        {"outer shadow", {"text:color=#2B3A55", "outer-shadow:angle=120,distance=6,size=6,opacity=0.6"}},
        {"inner shadow", {"text:color=#F4A259", "inner-shadow:angle=120,distance=4,size=4,opacity=0.8"}},
        {"outer glow", {"text:color=#5B2A86", "outer-glow:size=14,color=#FF3CAC,opacity=1"}},
        {"outer glow, colour ramp",
         {"text:color=#222222", "outer-glow:size=16,opacity=1,stops=#FFE600/#FF3C00/#8000FF"}},
        {"inner glow", {"text:color=#1F4E79", "inner-glow:size=5,color=#FFE14D,opacity=1"}},
        {"linear gradient", {"linear-gradient:angle=90,stops=#12C2E9/#C471ED/#F64F59"}},
        {"radial gradient", {"radial-gradient:scale=1,stops=#FFF176/#FF7043/#6A1B9A"}},
        {"pattern", {std::string("pattern:scale=1,tile=") + kDrawnTile}},
        {"bevel, inner, hard", {"text:color=#3A7BD5", "bevel:style=inner,size=5,depth=3,technique=hard"}},
        {"bevel, outer", {"text:color=#3A7BD5", "bevel:style=outer,size=5,depth=3"}},
        {"emboss", {"text:color=#C9A227", "emboss:size=6,depth=3"}},
        {"emboss, two-sided", {"text:color=#C9A227", "emboss:style=two-sided,size=6,depth=3"}},
        {"neon: stroke + glows",
         {"text:color=#FFFFFF", "stroke:size=2,color=#00B8D4", "inner-glow:size=4,color=#00E5FF,opacity=1",
          "outer-glow:size=14,color=#00E5FF,opacity=1"}},
        {"gradient + stroke + shadow",
         {"linear-gradient:stops=#FFD200/#F7971E", "stroke:size=3,color=#5A2D0C",
          "outer-shadow:distance=5,size=4,opacity=0.5"}},
        {"bevel + gradient + shadow",
         {"linear-gradient:stops=#D9DEE6/#6B7A8F", "bevel:size=4,depth=4,technique=hard",
          "outer-shadow:distance=4,size=5,opacity=0.5"}},
        {"pattern + stroke + glow",
         {std::string("pattern:scale=1,tile=") + kDrawnTile, "stroke:size=3,color=#2B2D42",
          "outer-glow:size=10,color=#FFC914,opacity=0.9"}},
    };
    return cells;
}

Image RenderGallery(const std::string& sampleText, const std::string& fontPath) {
    const std::string text = sampleText.empty() ? "Glimmer" : sampleText;
    const Image tile = StripeTile();

    struct Cell {
        Image sample;
        Image label;
    };
    std::vector<Cell> cells;
    int cardWidth = 0, sampleHeight = 0, labelHeight = 0;
    for (const GalleryCell& spec : GalleryCells()) {
        RenderRequest request = Request(text, fontPath, kSampleSize);
        for (const std::string& effect : spec.effects) {
            EffectRequest parsed = ParseEffect(effect);
            for (ParamValue& value : parsed.values) {
                if (value.path == kDrawnTile) value.image = tile;
            }
            request.effects.push_back(parsed);
        }
        Cell cell{Render(request).image, Label(spec.label, fontPath, kLabelSize, kLabelColor)};
        cardWidth = std::max({cardWidth, cell.sample.width, cell.label.width});
        sampleHeight = std::max(sampleHeight, cell.sample.height);
        labelHeight = std::max(labelHeight, cell.label.height);
        cells.push_back(std::move(cell));
    }
    cardWidth += 2 * kInset;
    const int cardHeight = sampleHeight + labelHeight + 3 * kInset;

    const Image title =
        Label("Glimmer \u2014 every effect of the stack, rendered by the library", fontPath, kTitleSize, 0xFF1B2230u);
    const int rows = (int(cells.size()) + kColumns - 1) / kColumns;
    const int width = std::max(kColumns * cardWidth + (kColumns + 1) * kGap, title.width + 2 * kGap);
    const int top = kGap + title.height + kGap / 2;
    const int height = top + rows * (cardHeight + kGap);
    if (int64_t(width) * height > glimmer::kMaxPixels || width > glimmer::kMaxSide || height > glimmer::kMaxSide) {
        throw RenderError("the gallery would be " + std::to_string(width) + "x" + std::to_string(height) +
                          " pixels; use a shorter sample text or a smaller font");
    }

    Image sheet(width, height, kSheetColor);
    DrawOver(&sheet, title, kGap, kGap);
    for (size_t i = 0; i < cells.size(); ++i) {
        const int x = kGap + int(i % kColumns) * (cardWidth + kGap);
        const int y = top + int(i / kColumns) * (cardHeight + kGap);
        Fill(&sheet, x, y, cardWidth, cardHeight, kCardColor);
        const Cell& cell = cells[i];
        DrawOver(&sheet, cell.sample, x + (cardWidth - cell.sample.width) / 2,
                 y + kInset + (sampleHeight - cell.sample.height) / 2);
        DrawOver(&sheet, cell.label, x + (cardWidth - cell.label.width) / 2, y + 2 * kInset + sampleHeight);
    }
    return sheet;
}

}  // namespace Glimmer::RenderTool

#pragma once
// One render of one text: a GxTextObject filled the way the Java bridge fills
// it (font, paint, view, line limit, text and line records, effects), its
// bitmap sized to the view plus the effect margins, and its pixels returned.

#include <climits>
#include <cstdint>
#include <string>
#include <vector>

#include "Effects.h"
#include "LineLayout.h"
#include "Png.h"
#include "text/GxLineInfo.h"

namespace Glimmer::RenderTool {

// Limits of what the renderer agrees to do, each with its reason.
struct Limits {
    // Text size: larger glyphs only make larger images; this keeps a typo
    // from asking for gigabytes.
    static constexpr float kMaxTextSize = 2048.0f;
    // Image side: PNG and the line masks are comfortable below this.
    static constexpr int kMaxSide = 32767;
    // Image area: every render holds several images of this size at once
    // (mask, work image, effect picture, result).
    static constexpr int64_t kMaxPixels = int64_t(1) << 26;
    // Text: lines are measured from their start per break opportunity.
    static constexpr size_t kMaxTextLength = 100000;
};

struct RenderRequest {
    std::string text = "Glimmer";
    std::string fontPath;          // empty: the bundled font
    float size = 72.0f;            // pixels per em
    float scaleX = 1.0f;
    float skewX = 0.0f;
    float letterSpacing = 0.0f;    // ems
    bool fakeBold = false;
    bool italic = false;
    bool antiAlias = true;
    bool subpixel = false;
    bool elegant = false;
    bool fontPadding = true;       // TextView's includeFontPadding
    std::string features;          // CSS font-feature-settings
    std::string locale;            // BCP 47 list for the paint
    int width = 0;                 // view size; 0: as large as the text needs
    int height = 0;
    int padding[4] = {0, 0, 0, 0};   // left, top, right, bottom
    Align align = Align::kLeft;
    int verticalGravity = 0x30;
    float wrap = -1.0f;            // < 0: at the view width when one is given; 0: never
    int maxLines = INT_MAX;        // a TextView without a limit reports INT_MAX
    int lineLimit = 0;             // the bridge's line limit; 0: none
    bool hasBackground = false;    // a background colour span over the text
    uint32_t background = 0;
    std::vector<EffectRequest> effects;
};

struct RenderResult {
    Image image;                   // 0xAARRGGBB, straight alpha
    int viewWidth = 0;
    int viewHeight = 0;
    int left = 0;                  // the effect stack's margins
    int top = 0;
    int right = 0;
    int bottom = 0;
    std::string key;               // printable appearance key
    std::vector<LayoutLine> layout;
    std::vector<GxLineInfo> lines; // the records handed over
};

// UsageError for a malformed request, RenderError for one that cannot be
// carried out.
RenderResult Render(const RenderRequest& request);

// Source-over of a straight-alpha image onto another at (x, y), clipped.
void DrawOver(Image* canvas, const Image& image, int x, int y);

}  // namespace Glimmer::RenderTool

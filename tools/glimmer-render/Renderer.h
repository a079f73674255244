#pragma once
// One render of one text: the request the command line or a JSON file makes,
// turned into a library text and rendered by the library.

#include <cstdint>
#include <string>
#include <vector>

#include "Effects.h"
#include "Png.h"
#include "glimmer/glimmer.h"

namespace Glimmer::RenderTool {

using glimmer::Align;
using glimmer::Gravity;

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
    Gravity gravity = Gravity::kTop;
    float wrap = -1.0f;            // < 0: at the view width when one is given; 0: never
    int firstLine = 0;             // the lines shown: from this one,
    int maxLines = 0;              // at most this many (0: all)
    bool hasBackground = false;    // a background colour behind each line
    uint32_t background = 0;
    bool exact = false;            // the engine's literal stacking instead of layer style
    std::vector<EffectRequest> effects;
};

struct RenderResult {
    Image image;                   // 0xAARRGGBB, straight alpha
    int viewWidth = 0;
    int viewHeight = 0;
    int left = 0;                  // the effect margins
    int top = 0;
    int right = 0;
    int bottom = 0;
    std::string key;               // printable appearance key
    std::vector<glimmer::Line> lines;
};

// UsageError for a malformed request, RenderError for one that cannot be
// carried out.
RenderResult Render(const RenderRequest& request);

// Source-over of a straight-alpha image onto another at (x, y), clipped.
void DrawOver(Image* canvas, const Image& image, int x, int y);

}  // namespace Glimmer::RenderTool

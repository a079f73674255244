// A request made into a library text. The renderer's own checks come first,
// so that a bad option is named as the user typed it; everything else the
// library checks and reports itself.

#include "Renderer.h"

#include <algorithm>
#include <cmath>

#include "BundledFont.h"
#include "Values.h"

namespace Glimmer::RenderTool {
namespace {

void Check(bool ok, const std::string& message) {
    if (!ok) throw UsageError(message);
}

void Validate(const RenderRequest& r) {
    Check(r.size >= 1.0f && r.size <= glimmer::kMaxTextSize, "--size must lie in 1..2048 pixels");
    Check(r.width >= 0 && r.width <= glimmer::kMaxSide, "--width must lie in 0..32767");
    Check(r.height >= 0 && r.height <= glimmer::kMaxSide, "--height must lie in 0..32767");
    for (int p : r.padding) Check(p >= 0 && p <= glimmer::kMaxSide, "--padding must lie in 0..32767");
    Check(r.wrap <= float(glimmer::kMaxSide), "--wrap must lie in 0..32767");
    Check(r.firstLine >= 0, "--first-line must not be negative");
    Check(r.maxLines >= 0, "--max-lines must not be negative");
    Check(std::isfinite(r.scaleX) && r.scaleX > 0.0f && r.scaleX <= 10.0f, "--scale-x must lie in (0, 10]");
    Check(std::isfinite(r.skewX) && std::fabs(r.skewX) <= 2.0f, "--skew-x must lie in -2..2");
    Check(std::isfinite(r.letterSpacing) && std::fabs(r.letterSpacing) <= 10.0f,
          "--letter-spacing must lie in -10..10 ems");
    Check(!r.text.empty(), "the text is empty");
}

glimmer::Font LoadFont(const std::string& path) {
    if (path.empty()) {
        // Loaded once: the library would hash the bytes again on every call.
        static const glimmer::Result<glimmer::Font> bundled = [] {
            const std::string_view font = BundledFont();
            return glimmer::Font::fromBytes(font.data(), font.size(), kBundledFontName);
        }();
        if (!bundled) throw RenderError("the bundled font cannot be loaded: " + bundled.status().message());
        return *bundled;
    }
    glimmer::Result<glimmer::Font> font = glimmer::Font::fromFile(path);
    if (!font) throw RenderError("--font: " + font.status().message());
    return *font;
}

}  // namespace

RenderResult Render(const RenderRequest& request) {
    Validate(request);
    glimmer::Text text;
    text.content = request.text;
    text.font = LoadFont(request.fontPath);
    glimmer::TextStyle& style = text.style;
    style.size = request.size;
    style.scaleX = request.scaleX;
    style.skewX = request.skewX;
    style.letterSpacing = request.letterSpacing;
    style.fakeBold = request.fakeBold;
    style.italic = request.italic;
    style.antiAlias = request.antiAlias;
    style.subpixel = request.subpixel;
    style.elegant = request.elegant;
    style.features = request.features;
    style.locale = request.locale;
    style.background = request.hasBackground ? request.background : 0;
    glimmer::Layout& layout = text.layout;
    layout.width = request.width;
    layout.height = request.height;
    layout.padding = {request.padding[0], request.padding[1], request.padding[2], request.padding[3]};
    layout.align = request.align;
    layout.gravity = request.gravity;
    layout.wrapWidth = request.wrap;
    layout.fontPadding = request.fontPadding;
    layout.firstLine = request.firstLine;
    layout.maxLines = request.maxLines;
    for (const EffectRequest& effect : request.effects) AddEffect(effect, &text);

    glimmer::Result<glimmer::Picture> rendered = glimmer::render(text, {.exact = request.exact});
    if (!rendered) {
        const glimmer::Status& status = rendered.status();
        const bool malformed = status.code() == glimmer::ErrorCode::kInvalidArgument ||
                               status.code() == glimmer::ErrorCode::kLineRange;
        if (malformed) throw UsageError(status.message());
        throw RenderError(status.message());
    }
    glimmer::Picture& picture = *rendered;
    RenderResult result;
    result.image.width = picture.image.width;
    result.image.height = picture.image.height;
    result.image.pixels = std::move(picture.image.pixels);
    result.viewWidth = picture.viewWidth;
    result.viewHeight = picture.viewHeight;
    result.left = picture.margins.left;
    result.top = picture.margins.top;
    result.right = picture.margins.right;
    result.bottom = picture.margins.bottom;
    result.key = std::move(picture.key);
    result.lines = std::move(picture.lines);
    return result;
}

void DrawOver(Image* canvas, const Image& image, int x, int y) {
    for (int row = 0; row < image.height; ++row) {
        const int cy = y + row;
        if (cy < 0 || cy >= canvas->height) continue;
        for (int column = 0; column < image.width; ++column) {
            const int cx = x + column;
            if (cx < 0 || cx >= canvas->width) continue;
            const uint32_t s = image.At(column, row);
            const uint32_t sa = s >> 24;
            if (sa == 0) continue;
            uint32_t& d = canvas->At(cx, cy);
            const uint32_t da = d >> 24;
            // Straight alpha: out = s·sa + d·da·(1 − sa), divided by the new alpha.
            const uint32_t oa255 = sa * 255 + da * (255 - sa);   // alpha × 255
            if (oa255 == 0) {
                d = 0;
                continue;
            }
            uint32_t out = ((oa255 + 127) / 255) << 24;
            for (int shift = 0; shift <= 16; shift += 8) {
                const uint32_t sc = s >> shift & 0xFF, dc = d >> shift & 0xFF;
                const uint32_t c = (sc * sa * 255 + dc * da * (255 - sa) + oa255 / 2) / oa255;
                out |= std::min<uint32_t>(c, 255) << shift;
            }
            d = out;
        }
    }
}

}  // namespace Glimmer::RenderTool

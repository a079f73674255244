#pragma once
// Glimmer: text with effects, rendered to pixels.
//
// A Text is a plain value: its content (UTF-8), a Font, the paint of its
// glyphs, how its lines are laid out in its view, and its effects. render()
// lays the text out, draws every effect and returns one picture: the view
// plus the margins the effects reach into, as 0xAARRGGBB words with straight
// alpha.
//
//   auto font = glimmer::Font::fromFile("/usr/share/fonts/truetype/dejavu/DejaVuSans-Bold.ttf");
//   if (!font) { std::puts(font.status().message().c_str()); return 1; }
//   glimmer::Text text{.content = "Hello", .font = *font, .style = {.size = 48}};
//   text.effects = {glimmer::Stroke{.size = 4}, glimmer::OuterShadow{.distance = 6}};
//   glimmer::Result<glimmer::Picture> picture = glimmer::render(text);
//
// Errors. Nothing here throws. An operation that can fail returns a Result:
// either its value, or a Status with an ErrorCode and a one-line message
// naming what was wrong. Bad input never crashes and never gives a silently
// blank picture.
//
// Threads. Font is an immutable handle: copy it and share it between threads
// freely. Text, Picture and the effect types are plain values with the usual
// rules (read one from several threads at once, write it from one). render()
// and the Font factories may be called from any thread; inside the library
// they take one process-wide lock, because the font store and fallback
// families they share are not safe to use concurrently. Calls from several
// threads are therefore safe but run one at a time.
//
// Fonts stay loaded for the life of the process: a file is read once per path,
// and the same bytes handed in twice are stored once. Characters the font
// lacks fall back to the system's fonts (fontconfig on Linux).

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "glimmer/effects.h"
#include "glimmer/version.h"

#if defined(_WIN32)
#define GLIMMER_API
#else
#define GLIMMER_API __attribute__((visibility("default")))
#endif

namespace glimmer {

// --- errors

enum class ErrorCode {
    kOk = 0,
    kInvalidArgument,   // a value outside its range, malformed text, a missing font
    kCannotRead,        // a file that cannot be opened or read
    kNotAFont,          // bytes the library cannot read as a font
    kLineRange,         // the lines asked for lie past the text's last line
    kTooLarge,          // the picture would be larger than the library draws
    kOutOfMemory,
    kInternal,          // a failure inside the library
};

class Status {
public:
    Status() = default;
    Status(ErrorCode code, std::string message) : code_(code), message_(std::move(message)) {}

    bool ok() const { return code_ == ErrorCode::kOk; }
    explicit operator bool() const { return ok(); }
    ErrorCode code() const { return code_; }
    // One line, without a trailing newline; empty when ok.
    const std::string& message() const { return message_; }

private:
    ErrorCode code_ = ErrorCode::kOk;
    std::string message_;
};

// A value or the Status saying why there is none. A failed Result still holds
// a default-constructed value, so value() is always safe to call.
template <typename T>
class Result {
public:
    Result(T value) : value_(std::move(value)) {}
    Result(Status status) : status_(std::move(status)) {
        if (status_.ok()) status_ = Status(ErrorCode::kInternal, "a failure without a reason");
    }

    bool ok() const { return status_.ok(); }
    explicit operator bool() const { return ok(); }
    const Status& status() const { return status_; }

    T& value() & { return value_; }
    const T& value() const& { return value_; }
    T&& value() && { return std::move(value_); }
    T& operator*() & { return value_; }
    const T& operator*() const& { return value_; }
    T&& operator*() && { return std::move(value_); }
    T* operator->() { return &value_; }
    const T* operator->() const { return &value_; }

private:
    T value_{};
    Status status_;
};

// --- fonts

namespace detail {
struct FontData;
struct FontAccess;
}  // namespace detail

// A TrueType or OpenType font (face 0 of a collection). Empty by default.
class GLIMMER_API Font {
public:
    Font() = default;

    // Reads the font file at `path`. kCannotRead when it cannot be read,
    // kNotAFont when it is no font.
    static Result<Font> fromFile(const std::string& path) noexcept;
    // Copies `size` bytes of font data. `name` only names the font, in
    // messages and for its style: as with a file name, "-Bold", "-Light",
    // "-Italic" and the like after a dash give the weight and slant.
    static Result<Font> fromBytes(const void* data, std::size_t size, std::string_view name = "font") noexcept;

    bool empty() const noexcept { return data_ == nullptr; }
    // The family name the font states ("" for an empty font or none stated).
    const std::string& familyName() const noexcept;

    friend bool operator==(const Font& a, const Font& b) noexcept { return a.data_ == b.data_; }

private:
    friend struct detail::FontAccess;
    std::shared_ptr<const detail::FontData> data_;
};

// --- text

enum class Align { kLeft, kCenter, kRight };      // lines in the view's width
enum class Gravity { kTop, kCenter, kBottom };    // the lines in the view's height

// How the glyphs are drawn.
struct TextStyle {
    float size = 48.0f;             // pixels per em, 1..2048
    // The fill colour. Its alpha fades the whole picture, effects included.
    Color color = 0xFF000000u;
    // Fades only the fill; the effects stay (0 leaves outline-and-glow-only
    // text). In exact mode the engine's text opacity instead, which does not
    // fade the fill.
    float fillOpacity = 1.0f;       // 0..1
    Color background = 0;           // fills each line's box behind the text; 0: none
    float scaleX = 1.0f;            // horizontal stretch, (0, 10]
    float skewX = 0.0f;             // slant, -2..2 (negative leans right)
    float letterSpacing = 0.0f;     // extra space between letters, ems, -10..10
    bool fakeBold = false;          // embolden the outlines
    bool italic = false;            // the font's italic, else a slanted copy
    bool antiAlias = true;          // off: every pixel fully on or off
    bool subpixel = false;          // place glyphs at fractional pixels
    bool elegant = false;           // prefer the elegant variant of fallback families
    std::string features{};         // OpenType features, CSS syntax: "'liga' 0, 'smcp'"
    std::string locale{};           // BCP 47 list steering fallback fonts, e.g. "ja" or "zh-Hant"
};

struct Padding {
    int left = 0;
    int top = 0;
    int right = 0;
    int bottom = 0;
};

// The view the text is laid out in. Lines break at '\n' ("\r\n" counts as
// one break) and, with a wrap width, at Unicode line-break opportunities; a
// word wider than the wrap width is cut between grapheme clusters.
struct Layout {
    int width = 0;                  // 0..32767; 0: as wide as the text needs
    int height = 0;                 // 0..32767; 0: as tall as the shown lines
    Padding padding{};              // 0..32767 each
    Align align = Align::kLeft;
    Gravity gravity = Gravity::kTop;
    // Below 0: wrap at the width inside the padding when a width is given,
    // else never; 0: never; above 0: at this width (at most the width inside
    // the padding).
    float wrapWidth = -1.0f;
    // The first line reaches up to the font's top and the last down to its
    // bottom, rather than to the ascent and descent lines.
    bool fontPadding = true;
    // The lines shown: from firstLine (0 is the first), at most maxLines of
    // them (0: all). A firstLine at or past the text's line count is an error.
    int firstLine = 0;
    int maxLines = 0;
};

struct Text {
    std::string content;            // UTF-8, not empty, no U+0000; at most 100000 UTF-16 units
    Font font{};                    // required
    TextStyle style{};
    Layout layout{};
    std::vector<Effect> effects{};
};

// --- rendering

struct RenderOptions {
    // The engine's literal behaviour: effects stack in the order given, inner
    // effects may paint outside the glyphs, the fill opacity is the engine's
    // text opacity. Off: layer style (see effects.h).
    bool exact = false;
};

// How far the effects reach past the view on each side.
struct Margins {
    int left = 0;
    int top = 0;
    int right = 0;
    int bottom = 0;
};

// One shown line, in picture coordinates.
struct Line {
    std::size_t begin = 0;          // UTF-8 byte range of the line's visible text in Text::content
    std::size_t end = 0;
    int x = 0;                      // left end of the baseline
    int baseline = 0;
    int width = 0;                  // advance of the visible text
    int top = 0;                    // the line's box, from its ascent to its descent
    int bottom = 0;
};

struct Picture {
    // (viewWidth + margins.left + margins.right) x (viewHeight + margins.top
    // + margins.bottom); the view's top-left corner is at (margins.left,
    // margins.top).
    Image image{};
    Margins margins{};
    int viewWidth = 0;
    int viewHeight = 0;
    std::vector<Line> lines{};
    // The effect engine's key of what it drew: per layer, in the order the
    // layers were added (the fill last), a letter for the kind and the
    // parameters as hex bytes
    // ("K848F8F8F8F808080808081 T8F8F808080808080"); for logs and caches.
    std::string key{};
};

// The limits render() enforces.
inline constexpr float kMaxTextSize = 2048.0f;        // pixels per em
inline constexpr int kMaxSide = 32767;                 // view and picture sides
inline constexpr std::int64_t kMaxPixels = std::int64_t(1) << 26;   // picture area
inline constexpr std::size_t kMaxTextLength = 100000;  // UTF-16 units
inline constexpr std::size_t kMaxStops = 256;          // per colour ramp
inline constexpr int kMaxTileSide = 4096;              // pattern tiles

GLIMMER_API Result<Picture> render(const Text& text, const RenderOptions& options = {}) noexcept;

// The version of the library loaded, e.g. "0.1.0".
GLIMMER_API const char* versionString() noexcept;

}  // namespace glimmer

// Fonts for the public API.
//
// A font is read (or copied from the caller's bytes), measured by the platform
// for the vertical metrics line layout needs, and handed to the core's font
// store under a key: its path, or for bytes a name made of their hash, size
// and the caller's name (the store takes weight and slant from the key's
// "-Bold", "-Italic" and the like). The store keeps every font for the life
// of the process, so the handles are cached here by key too: a path is read
// once, and the same bytes handed in twice are stored once.

#include <cmath>
#include <cstdio>
#include <cstring>
#include <map>
#include <new>
#include <utility>

#include "api/CoreAccess.h"
#include "api/FileBytes.h"
#include "api/FontData.h"
#include "font/FontManager.h"
#include "platform/FontMetrics.h"

namespace glimmer {
namespace detail {
namespace {

// Larger than any real font (a CJK collection is some tens of megabytes); a
// typo naming a disk image is refused before it is read.
constexpr std::size_t kMaxFontBytes = std::size_t(512) << 20;

// Every font handed out, by key; never emptied, as the core's store is not.
std::map<std::string, std::shared_ptr<const FontData>>& Cache() {
    static auto* cache = new std::map<std::string, std::shared_ptr<const FontData>>();
    return *cache;
}

// Measures face 0 of the font in `bytes`; false when it is no font.
bool Measure(const char* bytes, std::size_t size, FontData* out) {
    return Glimmer::Platform::ReadFontMetrics(bytes, size, &out->metrics);
}

std::string Quoted(std::string_view text) {
    std::string out;
    out.reserve(text.size() + 2);
    out += '\'';
    out += text;
    out += '\'';
    return out;
}

// 64-bit FNV-1a: tells font bytes apart for the store's key.
uint64_t Hash(const char* bytes, std::size_t size) {
    uint64_t h = 0xcbf29ce484222325u;
    for (std::size_t i = 0; i < size; ++i) {
        h ^= uint8_t(bytes[i]);
        h *= 0x100000001b3u;
    }
    return h;
}

// Measures the bytes and hands a copy to the core's store under `key`.
// `label` names the font in messages. Call with the core lock held.
Result<Font> Load(const std::string& key, const char* bytes, std::size_t size, const std::string& label) {
    auto data = std::make_shared<FontData>();
    data->key = key;
    const Status notAFont(ErrorCode::kNotAFont, label + " is not a font the library can read");
    if (!Measure(bytes, size, data.get())) return notAFont;
    char* copy = new (std::nothrow) char[size];
    if (copy == nullptr) return Status(ErrorCode::kOutOfMemory, "out of memory for the font " + label);
    std::memcpy(copy, bytes, size);
    // The store takes the copy, whether it makes a font of it or not.
    if (!Glimmer::FontManager::GetInstance()->AddMinikinFont(key.c_str(), copy, unsigned(size), 0, true)) {
        return notAFont;
    }
    Cache()[key] = data;
    return FontAccess::Make(std::move(data));
}

}  // namespace

FontExtent FontData::ExtentAt(float textSize) const {
    const float scale = textSize / metrics.unitsPerEm;
    FontExtent extent;
    extent.top = int(std::floor(-metrics.boxTop * scale));
    extent.ascent = int(std::lround(-metrics.ascent * scale));
    extent.descent = int(std::lround(-metrics.descent * scale));
    extent.bottom = int(std::ceil(-metrics.boxBottom * scale));
    return extent;
}

}  // namespace detail

Result<Font> Font::fromFile(const std::string& path) noexcept {
    try {
        if (path.empty()) return Status(ErrorCode::kInvalidArgument, "the font path is empty");
        if (path.find('\0') != std::string::npos) {
            return Status(ErrorCode::kInvalidArgument, "the font path contains a NUL character");
        }
        auto lock = detail::LockCore();
        const auto known = detail::Cache().find(path);
        if (known != detail::Cache().end()) return detail::FontAccess::Make(known->second);
        const detail::FileBytes file = detail::ReadFileBytes(path, detail::kMaxFontBytes);
        if (!file.error.empty()) return Status(ErrorCode::kCannotRead, file.error);
        return detail::Load(path, file.bytes.data(), file.bytes.size(), detail::Quoted(path));
    } catch (const std::bad_alloc&) {
        return Status(ErrorCode::kOutOfMemory, "out of memory reading a font");
    } catch (...) {
        return Status(ErrorCode::kInternal, "reading a font failed inside the library");
    }
}

Result<Font> Font::fromBytes(const void* data, std::size_t size, std::string_view name) noexcept {
    try {
        if (data == nullptr || size == 0) return Status(ErrorCode::kInvalidArgument, "no font bytes given");
        if (size > detail::kMaxFontBytes) {
            return Status(ErrorCode::kInvalidArgument,
                          "font bytes larger than " + std::to_string(detail::kMaxFontBytes) + " bytes");
        }
        if (name.find('\0') != std::string_view::npos) {
            return Status(ErrorCode::kInvalidArgument, "the font name contains a NUL character");
        }
        const char* bytes = static_cast<const char*>(data);
        char tag[48];
        std::snprintf(tag, sizeof tag, "bytes@%016llx+%zu/", static_cast<unsigned long long>(detail::Hash(bytes, size)),
                      size);
        const std::string key = tag + std::string(name);
        auto lock = detail::LockCore();
        const auto known = detail::Cache().find(key);
        if (known != detail::Cache().end()) return detail::FontAccess::Make(known->second);
        return detail::Load(key, bytes, size, detail::Quoted(name));
    } catch (const std::bad_alloc&) {
        return Status(ErrorCode::kOutOfMemory, "out of memory reading a font");
    } catch (...) {
        return Status(ErrorCode::kInternal, "reading a font failed inside the library");
    }
}

const std::string& Font::familyName() const noexcept {
    static const std::string none;
    return data_ != nullptr ? data_->metrics.familyName : none;
}

}  // namespace glimmer

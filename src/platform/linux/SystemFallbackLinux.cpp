// The last-resort font for a character, from fontconfig.
//
// Families cover the scripts a device's font configuration lists; a text may
// hold characters of any other script an installed font has (Syriac,
// Javanese, emoji when no emoji family is listed). For those, fontconfig is
// asked once per process for every font in its order of preference for
// sans-serif text (FcFontSort, untrimmed), with the set of characters each
// font maps. The answer for a character is the first of them whose set has
// it.
//
// Asking costs nothing per character: the fonts that map anything of a
// block of 128 code points are listed once per block (one intersection of
// character sets per font), and a character's answer is a walk along its
// block's short list. A font is mapped into memory read-only the first time
// it is the answer, and kept, like every font the library loads, for the
// life of the process.

#include <fcntl.h>
#include <fontconfig/fontconfig.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <mutex>
#include <string>
#include <unordered_map>
#include <vector>

#include "platform/SystemFonts.h"

namespace Glimmer::Platform {
namespace {

constexpr int kBlockBits = 7;

struct Face {
    std::string path;
    int index = 0;
    bool color = false;
    FcCharSet* characters = nullptr;   // a reference of our own
    std::shared_ptr<Font> font;
    bool tried = false;                // loading was attempted (font stays null on failure)
};

class FallbackFonts {
public:
    std::shared_ptr<Font> Find(uint32_t codePoint, bool color) {
        std::lock_guard<std::mutex> lock(mutex_);
        if (!listed_) List();
        for (uint16_t i : Block(codePoint >> kBlockBits)) {
            Face& face = faces_[i];
            if ((color && !face.color) || !FcCharSetHasChar(face.characters, codePoint)) continue;
            const std::shared_ptr<Font>& font = Load(&face);
            if (font != nullptr && font->HasGlyph(codePoint)) return font;
        }
        return nullptr;
    }

private:
    void List() {
        listed_ = true;
        if (!FcInit()) return;
        FcConfig* config = FcConfigGetCurrent();
        FcPattern* pattern = FcPatternCreate();
        if (pattern == nullptr) return;
        FcPatternAddString(pattern, FC_FAMILY, reinterpret_cast<const FcChar8*>("sans-serif"));
        FcConfigSubstitute(config, pattern, FcMatchPattern);
        FcDefaultSubstitute(pattern);
        FcResult result = FcResultNoMatch;
        FcFontSet* set = FcFontSort(config, pattern, FcFalse, nullptr, &result);
        FcPatternDestroy(pattern);
        for (int i = 0; set != nullptr && i < set->nfont && faces_.size() < 0xFFFF; ++i) {
            FcPattern* font = set->fonts[i];
            FcChar8* file = nullptr;
            FcCharSet* characters = nullptr;
            int index = 0;
            FcBool scalable = FcFalse, color = FcFalse;
            FcPatternGetBool(font, FC_SCALABLE, 0, &scalable);
            FcPatternGetBool(font, FC_COLOR, 0, &color);
            FcPatternGetInteger(font, FC_INDEX, 0, &index);
            // Named instances of variable fonts have indices above 0xFFFF; the
            // default instance is taken at its plain index.
            if (FcPatternGetString(font, FC_FILE, 0, &file) != FcResultMatch || file == nullptr ||
                FcPatternGetCharSet(font, FC_CHARSET, 0, &characters) != FcResultMatch || characters == nullptr ||
                !(scalable || color) || index < 0 || index > 0xFFFF) {
                continue;
            }
            Face face;
            face.path = reinterpret_cast<const char*>(file);
            face.index = index;
            face.color = color != FcFalse;
            face.characters = FcCharSetCopy(characters);
            faces_.push_back(std::move(face));
        }
        if (set != nullptr) FcFontSetDestroy(set);
    }

    // The faces that map anything in `block`, in order.
    const std::vector<uint16_t>& Block(uint32_t block) {
        auto found = blocks_.find(block);
        if (found != blocks_.end()) return found->second;
        std::vector<uint16_t>& list = blocks_[block];
        FcCharSet* range = FcCharSetCreate();
        if (range == nullptr) return list;
        for (uint32_t c = block << kBlockBits; c < (block + 1) << kBlockBits; ++c) FcCharSetAddChar(range, c);
        for (size_t i = 0; i < faces_.size(); ++i) {
            if (FcCharSetIntersectCount(faces_[i].characters, range) > 0) list.push_back(uint16_t(i));
        }
        FcCharSetDestroy(range);
        return list;
    }

    static const std::shared_ptr<Font>& Load(Face* face) {
        if (face->tried) return face->font;
        face->tried = true;
        const int fd = ::open(face->path.c_str(), O_RDONLY | O_CLOEXEC);
        if (fd < 0) return face->font;
        struct stat info;
        void* bytes = MAP_FAILED;
        if (::fstat(fd, &info) == 0 && S_ISREG(info.st_mode) && info.st_size > 0) {
            bytes = ::mmap(nullptr, size_t(info.st_size), PROT_READ, MAP_PRIVATE, fd, 0);
        }
        ::close(fd);
        if (bytes == MAP_FAILED) return face->font;
        // The mapping stays for the life of the process, as the font does.
        face->font = CreateFont(static_cast<const char*>(bytes), size_t(info.st_size), face->index, FontData::kBorrowed);
        if (face->font == nullptr) ::munmap(bytes, size_t(info.st_size));
        return face->font;
    }

    std::mutex mutex_;
    bool listed_ = false;
    std::vector<Face> faces_;
    std::unordered_map<uint32_t, std::vector<uint16_t>> blocks_;
};

}  // namespace

std::shared_ptr<Font> SystemFallbackFont(uint32_t codePoint, bool color) {
    if (codePoint > 0x10FFFF) return nullptr;
    static auto* fonts = new FallbackFonts();   // lives as long as the fonts it hands out
    return fonts->Find(codePoint, color);
}

}  // namespace Glimmer::Platform

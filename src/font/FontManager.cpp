// The font manager.
//
// Two maps hold everything. fontDataMap keys the bytes of each font file by
// its path; fontMap keys each face by path and collection index. Both keys
// end in a NUL character, and a face's key is the path followed by the one
// character '0' + index (so "a.ttf" index 0 is "a.ttf0"), the character
// truncated to a byte as it always has been: indices 256 apart share a key.
//
// Bytes read from a file stay in fontDataMap for the life of the manager,
// even when no face could be made of them: asking again for the same path
// fails the same way without reading the file again. Bytes handed in by a
// caller belong to the face made of them (or are freed when none is made).
// Only regular files are read: a pipe, directory or device is refused as a
// file that cannot be opened. Every failure leaves the calling thread a
// reason in words (Error).
//
// Families for a text: the text's own font first, as a family of one, its
// weight and slant taken from its name when the name has a dash after its
// first character ("Thin" 100, "Light" 300, "Medium" 500, "Black" 900,
// "Bold" 700, the first that occurs in that order; "Italic" anywhere makes it
// italic). A system Roboto file is left out, the system families hold it.
// Then every system family whose fonts are loaded, in configuration order.

#include "font/FontManager.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <map>
#include <new>
#include <string>

#include "foundation/Error.h"
#include "foundation/GxLog.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
#include "platform/Log.h"

namespace Glimmer {
namespace {

constexpr const char* kTag = "GxFontManager";

// Font files larger than this are not read: a face table offset is 32 bits.
constexpr long kMaxFontFileBytes = 0x7FFFFFFF;

std::string DataKey(const char* path) {
    std::string key(path);
    key.push_back('\0');
    return key;
}

std::string FontKey(const char* path, int ttcIndex) {
    std::string key(path);
    key.push_back(char('0' + ttcIndex));
    key.push_back('\0');
    return key;
}

// The UTF-8 of a string in a new[] array, or null (unconstructed string, or
// no memory).
char* Utf8Of(const GxString* text) {
    if (text == nullptr) return nullptr;
    int size = text->GetUTF8Size();
    if (size < 1) return nullptr;
    char* buffer = new (std::nothrow) char[size_t(size)];
    if (buffer == nullptr) return nullptr;
    if (text->GetUTF8(buffer, size) < 0) {
        delete[] buffer;
        return nullptr;
    }
    return buffer;
}

}  // namespace

struct GxFontManagerImpl {
    void ClearFontFamilies();
    void ClearFontMaps();

    double totalMegabytes = 0.0;
    std::map<std::string, GxFontData*> fontDataMap;
    std::map<std::string, std::shared_ptr<Platform::Font>> fontMap;
    List* systemFamilies = nullptr;
    bool systemFamiliesSet = false;
};

void DeleteFontFamily(GxFontFamily* family) {
    if (family == nullptr) return;
    if (family->fonts != nullptr) {
        int count = family->fonts->GetCount();
        for (int i = 0; i < count; ++i) {
            auto* entry = static_cast<GxFontEntry*>(family->fonts->Get(i));
            if (entry == nullptr) continue;
            delete entry->path;
            delete entry->name;
            delete entry;
        }
        delete family->fonts;
    }
    delete family;
}

void GxFontManagerImpl::ClearFontFamilies() {
    if (systemFamilies != nullptr) {
        int count = systemFamilies->GetCount();
        for (int i = 0; i < count; ++i) {
            DeleteFontFamily(static_cast<GxFontFamily*>(systemFamilies->Get(i)));
        }
        delete systemFamilies;
        systemFamilies = nullptr;
    }
    systemFamiliesSet = false;
}

void GxFontManagerImpl::ClearFontMaps() {
    // Faces go before the bytes they are made of.
    fontMap.clear();
    for (auto& [key, fontData] : fontDataMap) {
        delete[] fontData->data;
        delete fontData;
    }
    fontDataMap.clear();
    totalMegabytes = 0.0;
}

FontManager* FontManager::GetInstance() {
    static FontManager instance;
    return &instance;
}

FontManager::FontManager() : M(new (std::nothrow) GxFontManagerImpl()) {}

FontManager::~FontManager() {
    Platform::LogPrint(Platform::kLogDebug, kTag, "~FontManager(%p)", static_cast<void*>(this));
    if (M == nullptr) return;
    M->ClearFontMaps();
    M->ClearFontFamilies();
    delete M;
    M = nullptr;
}

bool FontManager::IsExisting(const char* path, int ttcIndex) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    if (path == nullptr || path[0] == '\0') {
        Platform::LogPrint(Platform::kLogDebug, kTag, "IsExisting() - path is NULL");
        return false;
    }
    return M->fontMap.count(FontKey(path, ttcIndex)) != 0;
}

bool FontManager::AddMinikinFont(const char* path, char* data, unsigned int size, int ttcIndex,
                                 bool checkExisting) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        delete[] data;
        return false;
    }
    if (path == nullptr || path[0] == '\0') {
        Platform::LogPrint(Platform::kLogDebug, kTag, "AddMinikinFont() - path is NULL");
        Error::SetReason("no font path or name was given");
        delete[] data;
        return false;
    }
    if (checkExisting && IsExisting(path, ttcIndex)) {
        delete[] data;
        return true;
    }

    // Bytes that belong to fontDataMap are never freed here.
    bool shared = false;
    if (data == nullptr) {
        shared = true;
        std::string key = DataKey(path);
        auto found = M->fontDataMap.find(key);
        if (found != M->fontDataMap.end()) {
            data = found->second->data;
            size = found->second->size;
            if (data == nullptr) {
                Error::SetReason("%s: could not be read when it was first asked for, and a font file is read only once",
                                 path);
            }
        } else {
            size = 0;
            data = getFontData(path, size);
            auto* fontData = new (std::nothrow) GxFontData();
            if (fontData == nullptr) {
                delete[] data;
                return false;
            }
            fontData->data = data;
            fontData->size = data != nullptr ? size : 0;
            M->fontDataMap.emplace(key, fontData);
            double megabytes = double(fontData->size) / 1.024e6;
            M->totalMegabytes += megabytes;
            if (GxLog::IsAllLogEnable()) {
                Platform::LogPrint(Platform::kLogDebug, kTag, "BUFFER TOTAL SIZE(%.2fMB) <- %s(%.2fMB) ",
                                   M->totalMegabytes, path, megabytes);
            }
        }
    }

    if (data == nullptr || size == 0) {
        Platform::LogPrint(Platform::kLogError, kTag, "AddMinikinFont() - Fail to get font");
        // A file that could not be read has said why already.
        if (!shared) Error::SetReason("%s: no font bytes were given", path);
        if (!shared) delete[] data;
        return false;
    }

    std::shared_ptr<Platform::Font> font = Platform::CreateFont(
        data, size, ttcIndex, shared ? Platform::FontData::kBorrowed : Platform::FontData::kAdoptArray);
    if (font == nullptr) {
        Platform::LogPrint(Platform::kLogError, kTag, "AddMinikinFont() - Fail to create typeface");
        Error::SetReason("%s: not a font (no face %d could be read from its %u bytes)", path, ttcIndex, size);
        if (!shared) delete[] data;
        return false;
    }
    // A face already known under the key stays; the new one (and bytes it
    // took) goes.
    M->fontMap.emplace(FontKey(path, ttcIndex), std::move(font));
    return true;
}

void FontManager::ForgetMinikinFont(const char* path, int ttcIndex) {
    if (M != nullptr && path != nullptr) M->fontMap.erase(FontKey(path, ttcIndex));
}

bool FontManager::AddMinikinFont(const GxString* path, char* data, unsigned int size, int ttcIndex,
                                 bool checkExisting) {
    if (path == nullptr || path->GetUTF8Size() < 0) {
        delete[] data;
        return false;
    }
    char* utf8 = Utf8Of(path);
    if (utf8 == nullptr) {
        delete[] data;
        return false;
    }
    bool added = AddMinikinFont(utf8, data, size, ttcIndex, checkExisting);
    delete[] utf8;
    return added;
}

namespace {

// The file for reading, or null (errno set; ENXIO for anything but a
// regular file). Reading a pipe would wait for a writer that may never come,
// a directory has no bytes, a device no end: only regular files are fonts.
// Opened without blocking, so that the check itself cannot wait on a pipe.
FILE* OpenFontFile(const char* path) {
    int fd = ::open(path, O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    if (fd < 0) return nullptr;
    struct stat info;
    if (::fstat(fd, &info) != 0 || !S_ISREG(info.st_mode)) {
        ::close(fd);
        errno = ENXIO;
        return nullptr;
    }
    FILE* file = ::fdopen(fd, "rb");
    if (file == nullptr) ::close(fd);
    return file;
}

}  // namespace

char* getFontData(const char* path, unsigned int& size) {
    FILE* file = OpenFontFile(path);
    if (file == nullptr) {
        Error::SetReason("%s: cannot be opened (%s)", path,
                         errno == ENXIO ? "not a regular file" : std::strerror(errno));
        Platform::LogPrint(Platform::kLogDebug, kTag, "getFontData: fail open file path = %s", path);
        return nullptr;
    }
    if (std::fseek(file, 0, SEEK_END) != 0) {
        Error::SetReason("%s: cannot be read (%s)", path, std::strerror(errno));
        Platform::LogPrint(Platform::kLogDebug, kTag,
                           "getFontData: fseek(file, 0, SEEK_END) failure path = %s", path);
        std::fclose(file);
        return nullptr;
    }
    long length = std::ftell(file);
    if (length < 1) {
        Error::SetReason("%s: empty file", path);
        Platform::LogPrint(Platform::kLogDebug, kTag, "getFontData: font length is 0 path = %s", path);
        std::fclose(file);
        return nullptr;
    }
    if (std::fseek(file, 0, SEEK_SET) != 0) {
        Error::SetReason("%s: cannot be read (%s)", path, std::strerror(errno));
        Platform::LogPrint(Platform::kLogDebug, kTag,
                           "getFontData: fseek(file, 0, SEEK_SET) failure path = %s", path);
        std::fclose(file);
        return nullptr;
    }
    // Too large to hold, or no memory: reported as the read that cannot happen.
    char* data = length <= kMaxFontFileBytes ? new (std::nothrow) char[size_t(length)] : nullptr;
    errno = 0;
    if (data == nullptr || std::fread(data, 1, size_t(length), file) != size_t(length)) {
        if (length > kMaxFontFileBytes) {
            Error::SetReason("%s: too large for a font file (%ld bytes)", path, length);
        } else if (data == nullptr) {
            Error::SetReason("%s: no memory for its %ld bytes", path, length);
        } else {
            Error::SetReason("%s: cannot be read (%s)", path, errno != 0 ? std::strerror(errno) : "cut short");
        }
        Platform::LogPrint(Platform::kLogDebug, kTag, "getFontData: fread failure path = %s length = %zu",
                           path, size_t(length));
        delete[] data;
        std::fclose(file);
        return nullptr;
    }
    std::fclose(file);
    size = unsigned(length);
    return data;
}

bool FontManager::BuildMinikinFamily(GxFontFamily* family) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    if (family == nullptr || family->fonts == nullptr || family->fonts->GetCount() <= 0) return false;
    int count = family->fonts->GetCount();
    for (int i = 0; i < count; ++i) {
        auto* entry = static_cast<GxFontEntry*>(family->fonts->Get(i));
        if (entry == nullptr) return false;
        char* path = Utf8Of(entry->path);
        if (path == nullptr) return false;
        bool added = AddMinikinFont(path, nullptr, 0, entry->ttcIndex, false);
        delete[] path;
        if (!added) return false;
    }
    return true;
}

bool FontManager::LoadMinikinFontFamily(unsigned int localeListId) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    if (M->systemFamilies == nullptr) return false;
    int count = M->systemFamilies->GetCount();
    for (int i = 0; i < count; ++i) {
        auto* family = static_cast<GxFontFamily*>(M->systemFamilies->Get(i));
        if (family != nullptr && family->built == 0 && family->localeListId == localeListId) {
            family->built = BuildMinikinFamily(family) ? 1 : 0;
            return true;
        }
    }
    return false;
}

bool FontManager::SetSystemFontFamilies(List* families) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    if (!M->systemFamiliesSet) {
        M->ClearFontFamilies();
        M->systemFamilies = families;
        M->systemFamiliesSet = true;
    }
    return true;
}

bool FontManager::IsSystemFontFamiliesAlreadySet() {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    return M->systemFamiliesSet;
}

const List* FontManager::GetSystemFontFamilies() {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return nullptr;
    }
    return M->systemFamilies;
}

double FontManager::GetTotalMegabytes() {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return 0.0;
    }
    return M->totalMegabytes;
}

bool FontManager::GetMinikinFont(std::shared_ptr<Platform::Font>& out, const GxString* path,
                                 int ttcIndex) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    char* utf8 = Utf8Of(path);
    if (utf8 == nullptr) return false;
    auto found = M->fontMap.find(FontKey(utf8, ttcIndex));
    delete[] utf8;
    if (found == M->fontMap.end()) return false;
    out = found->second;
    return true;
}

bool FontManager::GetMinikinFontFamilies(Platform::FontFamilies& out, const GxString* fontName,
                                         int* weight) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    if (GxLog::IsAllLogEnable()) {
        Platform::LogPrint(Platform::kLogDebug, kTag, "GetMinikinFontFamilies >>> GetMinikinFontFamilies");
    }
    int ownWeight = 400;
    if (weight == nullptr) weight = &ownWeight;

    if (fontName != nullptr) {
        bool italic = false;
        if (fontName->Find("-") >= 1) {
            italic = fontName->Find("Italic") >= 0;
            if (fontName->Find("Thin") >= 0) {
                *weight = 100;
            } else if (fontName->Find("Light") >= 0) {
                *weight = 300;
            } else if (fontName->Find("Medium") >= 0) {
                *weight = 500;
            } else if (fontName->Find("Black") >= 0) {
                *weight = 900;
            } else if (fontName->Find("Bold") >= 0) {
                *weight = 700;
            }
        }
        std::shared_ptr<Platform::Font> font;
        if (fontName->Find("/system/fonts/Roboto-") < 0 && GetMinikinFont(font, fontName, 0)) {
            std::vector<Platform::FontFamily::Member> members;
            members.push_back({font, *weight, italic});
            out.push_back(std::make_shared<Platform::FontFamily>(0u, 0, std::move(members)));
        }
    }

    int count = M->systemFamilies != nullptr ? M->systemFamilies->GetCount() : 0;
    for (int i = 0; i < count; ++i) {
        auto* family = static_cast<GxFontFamily*>(M->systemFamilies->Get(i));
        if (family == nullptr || family->built == 0 || family->fonts == nullptr ||
            family->fonts->GetCount() <= 0) {
            continue;
        }
        std::vector<Platform::FontFamily::Member> members;
        int fonts = family->fonts->GetCount();
        for (int f = 0; f < fonts; ++f) {
            auto* entry = static_cast<GxFontEntry*>(family->fonts->Get(f));
            std::shared_ptr<Platform::Font> font;
            if (entry != nullptr && GetMinikinFont(font, entry->path, entry->ttcIndex)) {
                members.push_back({font, entry->weight, entry->italic});
            }
        }
        if (!members.empty()) {
            out.push_back(std::make_shared<Platform::FontFamily>(family->localeListId, family->variant,
                                                                 std::move(members)));
        }
    }

    if (GxLog::IsAllLogEnable()) {
        Platform::LogPrint(Platform::kLogDebug, kTag, "GetMinikinFontFamilies <<< GetMinikinFontFamilies");
    }
    return true;
}

}  // namespace Glimmer

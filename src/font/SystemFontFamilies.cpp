#include "font/SystemFontFamilies.h"

#include <unistd.h>

#include <cstdio>
#include <new>

#include "font/FontManager.h"
#include "foundation/GxLog.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
#include "platform/LocaleList.h"
#include "platform/Log.h"

namespace Glimmer {
namespace {

constexpr const char* kTag = "GxFontManager";

GxString* NewString(const char* utf8) {
    auto* text = new (std::nothrow) GxString();
    if (text != nullptr && !text->Construct(utf8)) {
        delete text;
        return nullptr;
    }
    return text;
}

// A family of the usable fonts of `source`, or null when none is usable.
GxFontFamily* NewFamily(const Platform::SystemFontFamily& source) {
    auto* family = new (std::nothrow) GxFontFamily();
    if (family == nullptr) return nullptr;
    family->fonts = new (std::nothrow) List();
    if (family->fonts == nullptr || !family->fonts->Construct()) {
        DeleteFontFamily(family);
        return nullptr;
    }
    for (const Platform::SystemFont& font : source.fonts) {
        // Paths are cut to 1,023 bytes, as the configuration's buffer does.
        char path[1024];
        std::snprintf(path, sizeof path, "%s", font.path.c_str());
        if (::access(path, R_OK) != 0 || font.italic || !font.fallbackFor.empty()) continue;
        auto* entry = new (std::nothrow) GxFontEntry();
        if (entry == nullptr) continue;
        entry->path = NewString(path);
        entry->name = NewString(font.name.c_str());
        entry->ttcIndex = font.ttcIndex;
        entry->weight = font.weight;
        entry->italic = font.italic;
        if (entry->path == nullptr || !family->fonts->Add(entry)) {
            delete entry->path;
            delete entry->name;
            delete entry;
        }
    }
    if (family->fonts->GetCount() <= 0) {
        DeleteFontFamily(family);
        return nullptr;
    }
    return family;
}

}  // namespace

bool ConvertToFontFamilies(FontManager* manager, const std::vector<Platform::SystemFontFamily>& config,
                           List* out) {
    if (manager == nullptr || out == nullptr) return false;
    bool namedSeen = false;
    for (const Platform::SystemFontFamily& source : config) {
        bool eager = false;
        if (!source.name.empty()) {
            if (namedSeen) continue;
            namedSeen = true;
            eager = true;
        }
        GxFontFamily* family = NewFamily(source);
        if (family == nullptr) continue;
        const std::string& languages = source.languages;
        if (!languages.empty()) {
            family->localeListId = Platform::RegisterLocaleList(languages.c_str());
            if (languages == "und-Zsym") eager = true;
        } else {
            eager = true;
        }
        family->variant = source.variant;
        if (eager || languages == "und-Zsye") {
            family->built = manager->BuildMinikinFamily(family) ? 1 : 0;
        }
        if (!out->Add(family)) {
            DeleteFontFamily(family);
            continue;
        }
        if (GxLog::IsAllLogEnable()) {
            Platform::LogPrint(Platform::kLogDebug, kTag, "Family lang(%s) localeListId(%d) loaded(%s)",
                               languages.c_str(), int(family->localeListId),
                               family->built != 0 ? "TRUE" : "FALSE");
        }
    }
    return true;
}

bool InstallSystemFontFamilies(FontManager* manager) {
    if (manager == nullptr) return false;
    if (manager->IsSystemFontFamiliesAlreadySet()) return true;
    return InstallSystemFontFamilies(manager, Platform::GetSystemFontFamilies());
}

bool InstallSystemFontFamilies(FontManager* manager, const std::vector<Platform::SystemFontFamily>& config) {
    if (manager == nullptr) return false;
    if (manager->IsSystemFontFamiliesAlreadySet()) return true;
    auto* families = new (std::nothrow) List();
    if (families == nullptr) return false;
    if (!families->Construct() || !ConvertToFontFamilies(manager, config, families)) {
        int count = families->GetCount();
        for (int i = 0; i < count; ++i) DeleteFontFamily(static_cast<GxFontFamily*>(families->Get(i)));
        delete families;
        return false;
    }
    return manager->SetSystemFontFamilies(families);
}

bool InstallSystemFontFamilies() { return InstallSystemFontFamilies(FontManager::GetInstance()); }

}  // namespace Glimmer

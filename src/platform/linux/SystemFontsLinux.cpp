// The system's font families on Linux, from fontconfig.
//
// The families are laid out the way a device's font configuration lists
// them. First the default family, named "sans-serif": every face of the
// family fontconfig picks for "sans-serif". Then one fallback family per
// entry of a table of scripts and languages (the locale lists that text
// registers for the scripts it contains): the family fontconfig picks for
// "sans-serif" in that language, when it really supports the language and
// is not the default family already. Only the system's own choices are
// used, so its configuration decides which font serves which script.
//
// A family holds the normal-width, scalable, non-variable faces of that
// family name, upright and italic, ordered by weight, slant and file. Faces
// of one collection file appear with their collection index.

#include <fontconfig/fontconfig.h>

#include <algorithm>
#include <cmath>
#include <tuple>

#include "platform/SystemFonts.h"

namespace Glimmer::Platform {
namespace {

struct ScriptFamily {
    const char* locale;     // the locale list text registers for the script
    const char* language;   // the language fontconfig is asked about
};

constexpr ScriptFamily kScriptFamilies[] = {
    {"und-Arab", "ar"}, {"und-Ethi", "am"}, {"und-Hebr", "he"}, {"und-Thai", "th"},
    {"und-Armn", "hy"}, {"und-Geor", "ka"}, {"und-Deva", "hi"}, {"und-Beng", "bn"},
    {"und-Guru", "pa"}, {"und-Gujr", "gu"}, {"und-Orya", "or"}, {"und-Taml", "ta"},
    {"und-Telu", "te"}, {"und-Knda", "kn"}, {"und-Mlym", "ml"}, {"und-Sinh", "si"},
    {"und-Khmr", "km"}, {"und-Laoo", "lo"}, {"und-Mymr", "my"}, {"und-Thaa", "dv"},
    {"und-Cher", "chr"}, {"und-Tibt", "bo"}, {"und-Grek", "el"}, {"und-Cyrl", "ru"},
    {"zh-Hans", "zh-cn"}, {"zh-Hant", "zh-tw"}, {"ja", "ja"}, {"ko", "ko"},
};

const FcChar8* Text(const char* s) { return reinterpret_cast<const FcChar8*>(s); }

std::string StringOf(FcPattern* pattern, const char* object) {
    FcChar8* value = nullptr;
    if (FcPatternGetString(pattern, object, 0, &value) != FcResultMatch || value == nullptr) return "";
    return reinterpret_cast<const char*>(value);
}

// The family fontconfig picks for sans-serif text, in `language` when given;
// "" when its pick does not support that language.
std::string MatchFamily(FcConfig* config, const char* language) {
    FcPattern* pattern = FcPatternCreate();
    if (pattern == nullptr) return "";
    FcPatternAddString(pattern, FC_FAMILY, Text("sans-serif"));
    if (language != nullptr) FcPatternAddString(pattern, FC_LANG, Text(language));
    FcConfigSubstitute(config, pattern, FcMatchPattern);
    FcDefaultSubstitute(pattern);
    FcResult result = FcResultNoMatch;
    FcPattern* match = FcFontMatch(config, pattern, &result);
    FcPatternDestroy(pattern);
    if (match == nullptr) return "";
    std::string family = StringOf(match, FC_FAMILY);
    if (language != nullptr) {
        FcLangSet* languages = nullptr;
        if (FcPatternGetLangSet(match, FC_LANG, 0, &languages) != FcResultMatch ||
            FcLangSetHasLang(languages, Text(language)) == FcLangDifferentLang) {
            family.clear();
        }
    }
    FcPatternDestroy(match);
    return family;
}

std::vector<SystemFont> FacesOf(FcConfig* config, const std::string& family) {
    std::vector<SystemFont> fonts;
    FcPattern* pattern = FcPatternCreate();
    FcObjectSet* objects = FcObjectSetBuild(FC_FILE, FC_INDEX, FC_WEIGHT, FC_SLANT, FC_WIDTH,
                                            FC_SCALABLE, FC_VARIABLE, FC_POSTSCRIPT_NAME,
                                            FC_FULLNAME, nullptr);
    FcFontSet* set = nullptr;
    if (pattern != nullptr && objects != nullptr) {
        FcPatternAddString(pattern, FC_FAMILY, Text(family.c_str()));
        set = FcFontList(config, pattern, objects);
    }
    for (int i = 0; set != nullptr && i < set->nfont; ++i) {
        FcPattern* face = set->fonts[i];
        FcBool scalable = FcFalse, variable = FcFalse;
        int index = 0, slant = FC_SLANT_ROMAN, width = FC_WIDTH_NORMAL;
        double weight = FC_WEIGHT_REGULAR;
        FcPatternGetBool(face, FC_SCALABLE, 0, &scalable);
        FcPatternGetBool(face, FC_VARIABLE, 0, &variable);
        FcPatternGetInteger(face, FC_INDEX, 0, &index);
        FcPatternGetInteger(face, FC_SLANT, 0, &slant);
        FcPatternGetInteger(face, FC_WIDTH, 0, &width);
        if (FcPatternGetDouble(face, FC_WEIGHT, 0, &weight) != FcResultMatch) {
            int integerWeight = FC_WEIGHT_REGULAR;
            FcPatternGetInteger(face, FC_WEIGHT, 0, &integerWeight);
            weight = integerWeight;
        }
        std::string path = StringOf(face, FC_FILE);
        if (!scalable || variable || width != FC_WIDTH_NORMAL || index < 0 || index > 0xFFFF ||
            path.empty()) {
            continue;
        }
        SystemFont font;
        font.path = path;
        font.ttcIndex = index;
        font.weight = int(std::lround(FcWeightToOpenTypeDouble(weight)));
        font.italic = slant != FC_SLANT_ROMAN;
        font.name = StringOf(face, FC_POSTSCRIPT_NAME);
        if (font.name.empty()) font.name = StringOf(face, FC_FULLNAME);
        fonts.push_back(font);
    }
    if (set != nullptr) FcFontSetDestroy(set);
    if (objects != nullptr) FcObjectSetDestroy(objects);
    if (pattern != nullptr) FcPatternDestroy(pattern);

    auto key = [](const SystemFont& f) { return std::tie(f.weight, f.italic, f.path, f.ttcIndex); };
    std::sort(fonts.begin(), fonts.end(),
              [&](const SystemFont& a, const SystemFont& b) { return key(a) < key(b); });
    fonts.erase(std::unique(fonts.begin(), fonts.end(),
                            [](const SystemFont& a, const SystemFont& b) {
                                return a.path == b.path && a.ttcIndex == b.ttcIndex;
                            }),
                fonts.end());
    return fonts;
}

}  // namespace

std::vector<SystemFontFamily> GetSystemFontFamilies() {
    std::vector<SystemFontFamily> families;
    if (!FcInit()) return families;
    FcConfig* config = FcConfigGetCurrent();

    std::string defaultName = MatchFamily(config, nullptr);
    if (!defaultName.empty()) {
        SystemFontFamily family;
        family.name = "sans-serif";
        family.fonts = FacesOf(config, defaultName);
        if (!family.fonts.empty()) families.push_back(std::move(family));
    }
    for (const ScriptFamily& entry : kScriptFamilies) {
        std::string name = MatchFamily(config, entry.language);
        if (name.empty() || name == defaultName) continue;
        SystemFontFamily family;
        family.languages = entry.locale;
        family.fonts = FacesOf(config, name);
        if (!family.fonts.empty()) families.push_back(std::move(family));
    }
    return families;
}

}  // namespace Glimmer::Platform

// The locale-list registry: strings of BCP 47 tags to small ids.
//
// A list is parsed tag by tag (comma separated, blanks around tags ignored,
// '_' taken for '-'). A tag is kept when it starts with a language of two or
// three letters (or "und"), optionally followed by a script of four letters
// and a region of two letters or three digits; whatever follows those is
// dropped, as is a tag that does not start that way. The kept tags, written
// in canonical case and without repeats, joined by commas, are the key: two
// strings that normalise to the same list share one id. The empty list is
// id 0; other lists get 1, 2, 3... in the order they are first seen.

#include <cctype>
#include <map>
#include <mutex>
#include <string>
#include <vector>

#include "platform/LocaleList.h"

namespace Glimmer::Platform {
namespace {

struct Registry {
    std::mutex mutex;
    std::map<std::string, uint32_t> ids;
    std::vector<std::vector<std::string>> lists{std::vector<std::string>()};  // id 0: empty
};

Registry& TheRegistry() {
    static Registry* registry = new Registry();   // lives as long as the process
    return *registry;
}

bool AllOf(const std::string& s, int (*test)(int)) {
    for (char c : s) {
        if (!test(static_cast<unsigned char>(c))) return false;
    }
    return true;
}

std::string Lower(std::string s) {
    for (char& c : s) c = char(std::tolower(static_cast<unsigned char>(c)));
    return s;
}

std::string Upper(std::string s) {
    for (char& c : s) c = char(std::toupper(static_cast<unsigned char>(c)));
    return s;
}

// "" when the tag does not start with a well-formed language.
std::string NormaliseTag(const std::string& tag) {
    std::vector<std::string> parts;
    size_t pos = 0;
    while (pos <= tag.size()) {
        size_t dash = tag.find('-', pos);
        if (dash == std::string::npos) dash = tag.size();
        parts.push_back(tag.substr(pos, dash - pos));
        pos = dash + 1;
    }
    if (parts.empty() || parts[0].size() < 2 || parts[0].size() > 3 || !AllOf(parts[0], isalpha)) {
        return "";
    }
    std::string out = Lower(parts[0]);
    size_t next = 1;
    if (next < parts.size() && parts[next].size() == 4 && AllOf(parts[next], isalpha)) {
        std::string script = Lower(parts[next]);
        script[0] = char(std::toupper(static_cast<unsigned char>(script[0])));
        out += '-';
        out += script;
        ++next;
    }
    if (next < parts.size() && ((parts[next].size() == 2 && AllOf(parts[next], isalpha)) ||
                                (parts[next].size() == 3 && AllOf(parts[next], isdigit)))) {
        out += '-';
        out += Upper(parts[next]);
    }
    return out;
}

std::vector<std::string> Parse(const char* locales) {
    std::vector<std::string> tags;
    std::string text(locales);
    for (char& c : text) {
        if (c == '_') c = '-';
    }
    size_t pos = 0;
    while (pos <= text.size()) {
        size_t comma = text.find(',', pos);
        if (comma == std::string::npos) comma = text.size();
        size_t first = text.find_first_not_of(" \t", pos);
        if (first != std::string::npos && first < comma) {
            size_t last = text.find_last_not_of(" \t", comma - 1);
            std::string tag = NormaliseTag(text.substr(first, last - first + 1));
            bool repeat = false;
            for (const std::string& seen : tags) repeat = repeat || seen == tag;
            if (!tag.empty() && !repeat) tags.push_back(tag);
        }
        pos = comma + 1;
    }
    return tags;
}

}  // namespace

uint32_t RegisterLocaleList(const char* locales) {
    if (locales == nullptr) return kEmptyLocaleListId;
    std::vector<std::string> tags = Parse(locales);
    if (tags.empty()) return kEmptyLocaleListId;
    std::string key;
    for (const std::string& tag : tags) {
        if (!key.empty()) key += ',';
        key += tag;
    }

    Registry& registry = TheRegistry();
    std::lock_guard<std::mutex> lock(registry.mutex);
    auto found = registry.ids.find(key);
    if (found != registry.ids.end()) return found->second;
    uint32_t id = uint32_t(registry.lists.size());
    registry.lists.push_back(tags);
    registry.ids.emplace(key, id);
    return id;
}

std::vector<std::string> GetLocaleList(uint32_t id) {
    Registry& registry = TheRegistry();
    std::lock_guard<std::mutex> lock(registry.mutex);
    if (id >= registry.lists.size()) return {};
    return registry.lists[id];
}

}  // namespace Glimmer::Platform

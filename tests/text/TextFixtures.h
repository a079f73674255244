#pragma once
// Fonts and helpers shared by the text, font, platform and foundation tests.
// The fonts are Debian's (fonts-dejavu-core, fonts-noto-core, fonts-noto-cjk,
// fonts-noto-color-emoji); tests check properties of what they draw, never
// exact bytes of a font version (the picture table does that, by hash).

#include <stdlib.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

namespace Glimmer::Testing {

inline const char* kDejaVuSans = "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";
inline const char* kDejaVuSansBold = "/usr/share/fonts/truetype/dejavu/DejaVuSans-Bold.ttf";
inline const char* kNotoCjk = "/usr/share/fonts/opentype/noto/NotoSansCJK-Regular.ttc";
inline const char* kNotoColorEmoji = "/usr/share/fonts/truetype/noto/NotoColorEmoji.ttf";   // colour strikes

inline std::vector<char> ReadFile(const char* path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

// A new[] copy, the form the font manager takes bytes in.
inline char* NewArray(const std::vector<char>& bytes) {
    char* copy = new char[bytes.size()];
    std::copy(bytes.begin(), bytes.end(), copy);
    return copy;
}

// A scratch folder, removed with everything in it.
class TempDir {
public:
    TempDir() {
        char pattern[] = "/tmp/glimmer-test-XXXXXX";
        if (mkdtemp(pattern) != nullptr) path_ = pattern;
    }
    ~TempDir() {
        std::error_code ignored;
        if (!path_.empty()) std::filesystem::remove_all(path_, ignored);
    }
    std::string Write(const char* name, const std::vector<char>& bytes) const {
        const std::string file = path_ + "/" + name;
        std::ofstream(file, std::ios::binary).write(bytes.data(), std::streamsize(bytes.size()));
        return file;
    }
    const std::string& Path() const { return path_; }

private:
    std::string path_;
};

}  // namespace Glimmer::Testing

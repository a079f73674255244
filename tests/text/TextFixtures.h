#pragma once
// Fonts and helpers shared by the text, font and platform tests. The fonts
// are Debian's (fonts-dejavu-core, fonts-noto-core, fonts-noto-cjk,
// fonts-noto-color-emoji); tests
// check properties of what they draw, never exact bytes of a font version.

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

namespace Glimmer::Testing {

inline const char* kDejaVuSans = "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";
inline const char* kDejaVuSansBold = "/usr/share/fonts/truetype/dejavu/DejaVuSans-Bold.ttf";
inline const char* kNotoCjk = "/usr/share/fonts/opentype/noto/NotoSansCJK-Regular.ttc";
inline const char* kNotoColorEmoji = "/usr/share/fonts/truetype/noto/NotoColorEmoji.ttf";   // colour strikes

inline std::vector<char> ReadFile(const char* path) {
    std::vector<char> bytes;
    FILE* file = std::fopen(path, "rb");
    if (file == nullptr) return bytes;
    char chunk[65536];
    size_t n;
    while ((n = std::fread(chunk, 1, sizeof chunk, file)) > 0) bytes.insert(bytes.end(), chunk, chunk + n);
    std::fclose(file);
    return bytes;
}

// A new[] copy, the form the font manager takes bytes in.
inline char* NewArray(const std::vector<char>& bytes) {
    char* copy = new char[bytes.size()];
    std::copy(bytes.begin(), bytes.end(), copy);
    return copy;
}

// A scratch folder, removed with its files.
class TempDir {
public:
    TempDir() {
        char pattern[] = "/tmp/glimmer-text-XXXXXX";
        const char* made = mkdtemp(pattern);
        path_ = made != nullptr ? made : "/tmp";
    }
    ~TempDir() {
        for (const std::string& file : files_) std::remove(file.c_str());
        std::remove(path_.c_str());
    }
    std::string Write(const char* name, const std::vector<char>& bytes) {
        std::string file = path_ + "/" + name;
        FILE* out = std::fopen(file.c_str(), "wb");
        if (out != nullptr) {
            if (!bytes.empty()) std::fwrite(bytes.data(), 1, bytes.size(), out);
            std::fclose(out);
        }
        files_.push_back(file);
        return file;
    }
    const std::string& Path() const { return path_; }

private:
    std::string path_;
    std::vector<std::string> files_;
};

}  // namespace Glimmer::Testing

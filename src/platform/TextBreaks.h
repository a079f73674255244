#pragma once
// Unicode text segmentation: where a line may break, and where grapheme
// clusters (what a reader sees as one character) begin.

#include <cstddef>
#include <memory>
#include <vector>

namespace Glimmer::Platform {

class TextBreaker {
public:
    enum class Kind { kLine, kGrapheme };
    explicit TextBreaker(Kind kind);
    ~TextBreaker();
    TextBreaker(const TextBreaker&) = delete;
    TextBreaker& operator=(const TextBreaker&) = delete;

    // The boundaries after text[start] up to and including `end`, as absolute
    // indices, always ending with `end` (only that when the platform has no
    // rules for this kind).
    std::vector<size_t> Boundaries(const char16_t* text, size_t start, size_t end);

private:
    struct Impl;
    std::unique_ptr<Impl> impl_;
};

}  // namespace Glimmer::Platform

// Text segmentation with ICU's rule-based iterators (root locale).

#include <unicode/brkiter.h>
#include <unicode/unistr.h>

#include "platform/TextBreaks.h"

namespace Glimmer::Platform {

struct TextBreaker::Impl {
    std::unique_ptr<icu::BreakIterator> iterator;
};

TextBreaker::TextBreaker(Kind kind) : impl_(std::make_unique<Impl>()) {
    UErrorCode status = U_ZERO_ERROR;
    impl_->iterator.reset(kind == Kind::kLine
                              ? icu::BreakIterator::createLineInstance(icu::Locale::getRoot(), status)
                              : icu::BreakIterator::createCharacterInstance(icu::Locale::getRoot(), status));
    if (U_FAILURE(status)) impl_->iterator.reset();
}

TextBreaker::~TextBreaker() = default;

std::vector<size_t> TextBreaker::Boundaries(const char16_t* text, size_t start, size_t end) {
    std::vector<size_t> out;
    icu::BreakIterator* iterator = impl_->iterator.get();
    if (iterator != nullptr && text != nullptr && end > start) {
        icu::UnicodeString paragraph(false, reinterpret_cast<const UChar*>(text + start), int32_t(end - start));
        iterator->setText(paragraph);
        for (int32_t at = iterator->next(); at != icu::BreakIterator::DONE; at = iterator->next()) {
            if (at > 0) out.push_back(start + size_t(at));
        }
    }
    if (out.empty() || out.back() != end) out.push_back(end);
    return out;
}

}  // namespace Glimmer::Platform

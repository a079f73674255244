// GxString keeps its characters in a buffer of exactly length + 1 wide
// characters ending in 0; every change builds the new buffer first and frees
// the old one after, so a string may be appended to, inserted into or cut from
// itself.
//
// UTF-8 in: strict UTF-8 (no overlong forms, nothing above U+10FFFF, no
// truncated sequences), widened for Java's modified UTF-8 in two ways: a
// 3-byte high surrogate followed by a 3-byte low surrogate is one supplementary
// code point, and a lone surrogate stays a code point of its own. The process
// locale plays no part.
//
// UTF-8 out: the original 1-to-6-byte scheme, so the bytes written always
// match GetUTF8Size. For every Unicode scalar value that is plain UTF-8; a
// surrogate code point gets its 3-byte form, values above U+10FFFF the longer
// forms. Only values from 0x80000000 up (negative on targets with a signed
// wchar_t) have no form at all.
//
// UTF-16 out: a unit per character below 0xFFFF or above 0x10FFFF (truncated to
// 16 bits), a surrogate pair otherwise. The pair is computed as
// 0xD800 + ((c - 0x10000) >> 10), 0xDC00 + ((c - 0x10000) & 0x3FF) in 32-bit
// arithmetic and cut to 16 bits; for U+FFFF, which deliberately takes this
// path, that gives D7FF DFFF.

#include "foundation/GxString.h"

#include <cstdlib>
#include <cstring>
#include <new>

#include "foundation/Error.h"

namespace Glimmer {

struct GxStringImpl {
    wchar_t* text = nullptr;  // length + 1 characters, 0-terminated
    int length = 0;
};

namespace {

constexpr const char* kTag = "GxString";

uint32_t CodePoint(wchar_t c) { return static_cast<uint32_t>(c); }

int Utf8Units(uint32_t c) {
    if (c < 0x80) return 1;
    if (c < 0x800) return 2;
    if (c < 0x10000) return 3;
    if (c < 0x200000) return 4;
    if (c < 0x4000000) return 5;
    return 6;
}

int Utf16Units(uint32_t c) { return (c < 0xFFFF || c > 0x10FFFF) ? 1 : 2; }

// Decodes one character at `s` (not at the terminator). Returns the bytes
// consumed, or 0 when the bytes are not acceptable.
int DecodeOne(const unsigned char* s, uint32_t* out) {
    const unsigned char lead = s[0];
    if (lead < 0x80) {
        *out = lead;
        return 1;
    }
    int units;
    uint32_t value;
    uint32_t lowest;
    if (lead >= 0xC2 && lead <= 0xDF) {
        units = 2, value = lead & 0x1Fu, lowest = 0x80;
    } else if (lead >= 0xE0 && lead <= 0xEF) {
        units = 3, value = lead & 0x0Fu, lowest = 0x800;
    } else if (lead >= 0xF0 && lead <= 0xF4) {
        units = 4, value = lead & 0x07u, lowest = 0x10000;
    } else {
        return 0;
    }
    // Stops at the terminator too, since 0 is not a continuation byte.
    for (int i = 1; i < units; ++i) {
        if ((s[i] & 0xC0) != 0x80) return 0;
        value = (value << 6) | (s[i] & 0x3Fu);
    }
    if (value < lowest || value > 0x10FFFF) return 0;
    if (value >= 0xD800 && value <= 0xDBFF) {
        // Modified UTF-8 writes a supplementary character as two surrogates.
        uint32_t low = 0;
        if (s[3] == 0xED && DecodeOne(s + 3, &low) == 3 && low >= 0xDC00 && low <= 0xDFFF) {
            *out = 0x10000 + ((value - 0xD800) << 10) + (low - 0xDC00);
            return 6;
        }
    }
    *out = value;
    return units;
}

// Widens `utf8` (count < 0: up to the terminator; otherwise at most `count`
// characters) into a new 0-terminated buffer. Returns false with the error
// code to report when the bytes are not acceptable or too long.
bool DecodeUtf8(const char* utf8, int count, wchar_t** text, int* length, uint32_t* code) {
    const auto* s = reinterpret_cast<const unsigned char*>(utf8);
    int n = 0;
    size_t at = 0;
    uint32_t c;
    while (s[at] != 0 && (count < 0 || n < count)) {
        int used = DecodeOne(s + at, &c);
        if (used == 0) {
            *code = kErrorInvalidArgument;
            return false;
        }
        if (n == GxString::kMaxLength) {
            *code = kErrorLimitReached;
            return false;
        }
        at += size_t(used);
        ++n;
    }
    auto* out = static_cast<wchar_t*>(std::malloc((size_t(n) + 1) * sizeof(wchar_t)));
    if (out == nullptr) {
        *code = kErrorSystemCall;
        return false;
    }
    at = 0;
    for (int i = 0; i < n; ++i) {
        at += size_t(DecodeOne(s + at, &c));
        out[i] = static_cast<wchar_t>(c);
    }
    out[n] = 0;
    *text = out;
    *length = n;
    return true;
}

// Characters before the terminator, reading no further than `limit`.
int WideLength(const wchar_t* s, int limit) {
    int n = 0;
    while (n < limit && s[n] != 0) ++n;
    return n;
}

// Length of a whole wide source, or -1 when it is longer than a GxString may be.
int SourceLength(const wchar_t* s) {
    int n = WideLength(s, GxString::kMaxLength);
    return s[n] != 0 ? -1 : n;
}

// Decoded text of a byte-string argument, freed on scope exit.
struct Decoded {
    wchar_t* text = nullptr;
    int length = 0;
    ~Decoded() { std::free(text); }
};

int Compare(const wchar_t* a, int aLength, const wchar_t* b, int bLength) {
    int n = aLength < bLength ? aLength : bLength;
    for (int i = 0; i < n; ++i) {
        uint32_t x = CodePoint(a[i]);
        uint32_t y = CodePoint(b[i]);
        if (x != y) return x < y ? -1 : 1;
    }
    return aLength == bLength ? 0 : (aLength < bLength ? -1 : 1);
}

int FindIn(const wchar_t* hay, int hayLength, const wchar_t* needle, int needleLength, bool last) {
    if (needleLength > hayLength) return -1;
    const int lastStart = hayLength - needleLength;
    for (int k = 0; k <= lastStart; ++k) {
        int i = last ? lastStart - k : k;
        if (std::memcmp(hay + i, needle, size_t(needleLength) * sizeof(wchar_t)) == 0) return i;
    }
    return -1;
}

}  // namespace

// Every public member checks its state through these two, so that the log
// line names the caller's source line.
#define GXS_FAIL(code, value)              \
    do {                                   \
        GX_REPORT_ERROR(kTag, (code));     \
        return value;                      \
    } while (0)
#define GXS_REQUIRE_CONSTRUCTED(value) \
    if (mImpl == nullptr) GXS_FAIL(kErrorNotConstructed, value)

namespace {

// Replaces `removed` characters at `start` of `impl` with `length` characters
// of `text` (which may point into impl's own buffer). Returns 0 or an error code.
uint32_t Splice(GxStringImpl* impl, int start, int removed, const wchar_t* text, int length) {
    const int kept = impl->length - removed;
    if (length > GxString::kMaxLength - kept) return kErrorLimitReached;
    const int newLength = kept + length;
    auto* out = static_cast<wchar_t*>(std::malloc((size_t(newLength) + 1) * sizeof(wchar_t)));
    if (out == nullptr) return kErrorSystemCall;
    const wchar_t* old = impl->text;
    std::memcpy(out, old, size_t(start) * sizeof(wchar_t));
    if (length > 0) std::memcpy(out + start, text, size_t(length) * sizeof(wchar_t));
    std::memcpy(out + start + length, old + start + removed,
                size_t(impl->length - start - removed) * sizeof(wchar_t));
    out[newLength] = 0;
    std::free(impl->text);
    impl->text = out;
    impl->length = newLength;
    return kErrorNone;
}

GxStringImpl* NewImpl(const wchar_t* text, int length) {
    auto* impl = new (std::nothrow) GxStringImpl;
    if (impl == nullptr) return nullptr;
    impl->text = static_cast<wchar_t*>(std::malloc((size_t(length) + 1) * sizeof(wchar_t)));
    if (impl->text == nullptr) {
        delete impl;
        return nullptr;
    }
    if (length > 0) std::memcpy(impl->text, text, size_t(length) * sizeof(wchar_t));
    impl->text[length] = 0;
    impl->length = length;
    return impl;
}

}  // namespace

GxString::GxString() = default;

GxString::~GxString() {
    if (mImpl != nullptr) std::free(mImpl->text);
    delete mImpl;
}

// ---- Construction ----------------------------------------------------------

bool GxString::Construct() {
    if (mImpl != nullptr) GXS_FAIL(kErrorAlreadyConstructed, false);
    mImpl = NewImpl(nullptr, 0);
    if (mImpl == nullptr) GXS_FAIL(kErrorSystemCall, false);
    return true;
}

bool GxString::Construct(const GxString* source) {
    if (mImpl != nullptr) GXS_FAIL(kErrorAlreadyConstructed, false);
    if (source == nullptr) GXS_FAIL(kErrorInvalidArgument, false);
    if (source->mImpl == nullptr) GXS_FAIL(kErrorNotConstructed, false);
    mImpl = NewImpl(source->mImpl->text, source->mImpl->length);
    if (mImpl == nullptr) GXS_FAIL(kErrorSystemCall, false);
    return true;
}

bool GxString::Construct(const wchar_t* source) {
    if (mImpl != nullptr) GXS_FAIL(kErrorAlreadyConstructed, false);
    if (source == nullptr) GXS_FAIL(kErrorInvalidArgument, false);
    int length = SourceLength(source);
    if (length < 0) GXS_FAIL(kErrorLimitReached, false);
    mImpl = NewImpl(source, length);
    if (mImpl == nullptr) GXS_FAIL(kErrorSystemCall, false);
    return true;
}

bool GxString::Construct(const char* utf8) {
    if (mImpl != nullptr) GXS_FAIL(kErrorAlreadyConstructed, false);
    if (utf8 == nullptr) GXS_FAIL(kErrorInvalidArgument, false);
    Decoded d;
    uint32_t code = kErrorNone;
    if (!DecodeUtf8(utf8, -1, &d.text, &d.length, &code)) GXS_FAIL(code, false);
    mImpl = new (std::nothrow) GxStringImpl;
    if (mImpl == nullptr) GXS_FAIL(kErrorSystemCall, false);
    mImpl->text = d.text;  // adopt the decoded buffer: it is exactly length + 1
    mImpl->length = d.length;
    d.text = nullptr;
    return true;
}

bool GxString::Construct(const GxString* source, int length) {
    if (mImpl != nullptr) GXS_FAIL(kErrorAlreadyConstructed, false);
    if (source == nullptr || length < 0) GXS_FAIL(kErrorInvalidArgument, false);
    if (source->mImpl == nullptr) GXS_FAIL(kErrorNotConstructed, false);
    int n = length < source->mImpl->length ? length : source->mImpl->length;
    mImpl = NewImpl(source->mImpl->text, n);
    if (mImpl == nullptr) GXS_FAIL(kErrorSystemCall, false);
    return true;
}

bool GxString::Construct(const wchar_t* source, int length) {
    if (mImpl != nullptr) GXS_FAIL(kErrorAlreadyConstructed, false);
    if (source == nullptr || length < 0) GXS_FAIL(kErrorInvalidArgument, false);
    int n = WideLength(source, length);
    if (n > kMaxLength) GXS_FAIL(kErrorLimitReached, false);
    mImpl = NewImpl(source, n);
    if (mImpl == nullptr) GXS_FAIL(kErrorSystemCall, false);
    return true;
}

// ---- Editing ---------------------------------------------------------------

bool GxString::Set(const GxString* source) {
    GXS_REQUIRE_CONSTRUCTED(false);
    if (source == nullptr) return Clear();
    if (source->mImpl == nullptr) GXS_FAIL(kErrorNotConstructed, false);
    uint32_t code = Splice(mImpl, 0, mImpl->length, source->mImpl->text, source->mImpl->length);
    if (code != kErrorNone) GXS_FAIL(code, false);
    return true;
}

bool GxString::Set(const wchar_t* source) {
    GXS_REQUIRE_CONSTRUCTED(false);
    if (source == nullptr) return Clear();
    int length = SourceLength(source);
    if (length < 0) GXS_FAIL(kErrorLimitReached, false);
    uint32_t code = Splice(mImpl, 0, mImpl->length, source, length);
    if (code != kErrorNone) GXS_FAIL(code, false);
    return true;
}

bool GxString::Set(const char* utf8) {
    GXS_REQUIRE_CONSTRUCTED(false);
    if (utf8 == nullptr) return Clear();
    Decoded d;
    uint32_t code = kErrorNone;
    if (!DecodeUtf8(utf8, -1, &d.text, &d.length, &code)) GXS_FAIL(code, false);
    std::free(mImpl->text);
    mImpl->text = d.text;
    mImpl->length = d.length;
    d.text = nullptr;
    return true;
}

bool GxString::Clear() {
    GXS_REQUIRE_CONSTRUCTED(false);
    uint32_t code = Splice(mImpl, 0, mImpl->length, nullptr, 0);
    if (code != kErrorNone) GXS_FAIL(code, false);
    return true;
}

bool GxString::Append(const GxString* source) {
    GXS_REQUIRE_CONSTRUCTED(false);
    if (source == nullptr) GXS_FAIL(kErrorInvalidArgument, false);
    if (source->mImpl == nullptr) GXS_FAIL(kErrorNotConstructed, false);
    uint32_t code = Splice(mImpl, mImpl->length, 0, source->mImpl->text, source->mImpl->length);
    if (code != kErrorNone) GXS_FAIL(code, false);
    return true;
}

bool GxString::Append(const wchar_t* source) {
    GXS_REQUIRE_CONSTRUCTED(false);
    if (source == nullptr) GXS_FAIL(kErrorInvalidArgument, false);
    int length = SourceLength(source);
    if (length < 0) GXS_FAIL(kErrorLimitReached, false);
    uint32_t code = Splice(mImpl, mImpl->length, 0, source, length);
    if (code != kErrorNone) GXS_FAIL(code, false);
    return true;
}

bool GxString::Append(const char* utf8) {
    GXS_REQUIRE_CONSTRUCTED(false);
    if (utf8 == nullptr) GXS_FAIL(kErrorInvalidArgument, false);
    Decoded d;
    uint32_t code = kErrorNone;
    if (!DecodeUtf8(utf8, -1, &d.text, &d.length, &code)) GXS_FAIL(code, false);
    code = Splice(mImpl, mImpl->length, 0, d.text, d.length);
    if (code != kErrorNone) GXS_FAIL(code, false);
    return true;
}

bool GxString::Insert(const wchar_t* source, int index) {
    GXS_REQUIRE_CONSTRUCTED(false);
    if (source == nullptr) GXS_FAIL(kErrorInvalidArgument, false);
    if (index < 0 || index > mImpl->length) GXS_FAIL(kErrorIndexOutOfRange, false);
    int length = SourceLength(source);
    if (length < 0) GXS_FAIL(kErrorLimitReached, false);
    uint32_t code = Splice(mImpl, index, 0, source, length);
    if (code != kErrorNone) GXS_FAIL(code, false);
    return true;
}

bool GxString::Insert(const GxString* source, int index) {
    GXS_REQUIRE_CONSTRUCTED(false);
    if (source == nullptr) GXS_FAIL(kErrorInvalidArgument, false);
    if (source->mImpl == nullptr) GXS_FAIL(kErrorNotConstructed, false);
    if (index < 0 || index > mImpl->length) GXS_FAIL(kErrorIndexOutOfRange, false);
    uint32_t code = Splice(mImpl, index, 0, source->mImpl->text, source->mImpl->length);
    if (code != kErrorNone) GXS_FAIL(code, false);
    return true;
}

bool GxString::Remove(int index, int count) {
    GXS_REQUIRE_CONSTRUCTED(false);
    if (index < 0 || index > mImpl->length) GXS_FAIL(kErrorIndexOutOfRange, false);
    if (count < 0) GXS_FAIL(kErrorInvalidArgument, false);
    int n = count < mImpl->length - index ? count : mImpl->length - index;
    uint32_t code = Splice(mImpl, index, n, nullptr, 0);
    if (code != kErrorNone) GXS_FAIL(code, false);
    return true;
}

bool GxString::SetSubstring(const GxString* source, int start, int count) {
    GXS_REQUIRE_CONSTRUCTED(false);
    if (source == nullptr) GXS_FAIL(kErrorInvalidArgument, false);
    if (source->mImpl == nullptr) GXS_FAIL(kErrorNotConstructed, false);
    const int sourceLength = source->mImpl->length;
    if (start < 0 || start > sourceLength) GXS_FAIL(kErrorIndexOutOfRange, false);
    if (count < 0) GXS_FAIL(kErrorInvalidArgument, false);
    int n = count < sourceLength - start ? count : sourceLength - start;
    uint32_t code = Splice(mImpl, 0, mImpl->length, source->mImpl->text + start, n);
    if (code != kErrorNone) GXS_FAIL(code, false);
    return true;
}

// ---- Queries ---------------------------------------------------------------

int GxString::GetLength() const {
    GXS_REQUIRE_CONSTRUCTED(-1);
    return mImpl->length;
}

const wchar_t* GxString::GetPointer() const {
    GXS_REQUIRE_CONSTRUCTED(nullptr);
    return mImpl->text;
}

bool GxString::GetChar(int index, wchar_t* out) const {
    GXS_REQUIRE_CONSTRUCTED(false);
    if (out == nullptr) GXS_FAIL(kErrorInvalidArgument, false);
    if (index < 0 || index >= mImpl->length) GXS_FAIL(kErrorIndexOutOfRange, false);
    *out = mImpl->text[index];
    return true;
}

int GxString::GetUTF8Size() const {
    GXS_REQUIRE_CONSTRUCTED(-1);
    int size = 1;  // at most 6 x kMaxLength + 1: fits
    for (int i = 0; i < mImpl->length; ++i) size += Utf8Units(CodePoint(mImpl->text[i]));
    return size;
}

int GxString::GetUTF8(char* buffer, int size) const {
    GXS_REQUIRE_CONSTRUCTED(-1);
    if (buffer == nullptr || size < 0) GXS_FAIL(kErrorInvalidArgument, -1);
    if (size == 0) return 0;
    auto* out = reinterpret_cast<unsigned char*>(buffer);
    const int room = size - 1;
    int at = 0;
    for (int i = 0; i < mImpl->length; ++i) {
        const uint32_t c = CodePoint(mImpl->text[i]);
        if (c >= 0x80000000u) {
            out[at] = 0;
            GXS_FAIL(kErrorInvalidArgument, -1);
        }
        const int units = Utf8Units(c);
        if (units > room - at) break;  // whole characters only
        if (units == 1) {
            out[at++] = static_cast<unsigned char>(c);
            continue;
        }
        // Lead byte: `units` high bits set, then a 0, then the top payload bits.
        static constexpr unsigned char kLead[7] = {0, 0, 0xC0, 0xE0, 0xF0, 0xF8, 0xFC};
        for (int k = units - 1; k > 0; --k) {
            out[at + k] = static_cast<unsigned char>(0x80 | ((c >> (6 * (units - 1 - k))) & 0x3F));
        }
        out[at] = static_cast<unsigned char>(kLead[units] | (c >> (6 * (units - 1))));
        at += units;
    }
    out[at] = 0;
    return at;
}

int GxString::GetUTF16Size() const {
    GXS_REQUIRE_CONSTRUCTED(-1);
    int size = 1;
    for (int i = 0; i < mImpl->length; ++i) size += Utf16Units(CodePoint(mImpl->text[i]));
    return size;
}

uint16_t* GxString::GetUTF16() const {
    if (mImpl == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        auto* empty = new (std::nothrow) uint16_t[1];
        if (empty != nullptr) empty[0] = 0;
        return empty;
    }
    const int size = GetUTF16Size();
    auto* out = new (std::nothrow) uint16_t[size_t(size)];
    if (out == nullptr) GXS_FAIL(kErrorSystemCall, nullptr);
    int at = 0;
    for (int i = 0; i < mImpl->length; ++i) {
        const uint32_t c = CodePoint(mImpl->text[i]);
        if (Utf16Units(c) == 1) {
            out[at++] = static_cast<uint16_t>(c);
        } else {
            const uint32_t v = c - 0x10000u;  // wraps for U+FFFF, deliberately
            out[at++] = static_cast<uint16_t>(0xD800u + (v >> 10));
            out[at++] = static_cast<uint16_t>(0xDC00u + (v & 0x3FFu));
        }
    }
    out[at] = 0;
    return out;
}

// ---- Comparison and search ---------------------------------------------------

int GxString::CompareTo(const GxString* other) const {
    GXS_REQUIRE_CONSTRUCTED(-1);
    if (other == nullptr) GXS_FAIL(kErrorInvalidArgument, -1);
    if (other->mImpl == nullptr) GXS_FAIL(kErrorNotConstructed, -1);
    return Compare(mImpl->text, mImpl->length, other->mImpl->text, other->mImpl->length);
}

int GxString::CompareTo(const char* utf8) const {
    GXS_REQUIRE_CONSTRUCTED(-1);
    if (utf8 == nullptr) GXS_FAIL(kErrorInvalidArgument, -1);
    Decoded d;
    uint32_t code = kErrorNone;
    if (!DecodeUtf8(utf8, -1, &d.text, &d.length, &code)) GXS_FAIL(code, -1);
    return Compare(mImpl->text, mImpl->length, d.text, d.length);
}

int GxString::CompareTo(const char* utf8, int count) const {
    GXS_REQUIRE_CONSTRUCTED(-1);
    if (utf8 == nullptr || count < 0) GXS_FAIL(kErrorInvalidArgument, -1);
    Decoded d;
    uint32_t code = kErrorNone;
    if (!DecodeUtf8(utf8, count, &d.text, &d.length, &code)) GXS_FAIL(code, -1);
    int mine = mImpl->length < count ? mImpl->length : count;
    return Compare(mImpl->text, mine, d.text, d.length);
}

int GxString::Find(const wchar_t* needle) const {
    GXS_REQUIRE_CONSTRUCTED(-1);
    if (needle == nullptr) GXS_FAIL(kErrorInvalidArgument, -1);
    int n = WideLength(needle, mImpl->length + 1);
    return FindIn(mImpl->text, mImpl->length, needle, n, false);
}

int GxString::Find(const char* utf8) const {
    GXS_REQUIRE_CONSTRUCTED(-1);
    if (utf8 == nullptr) GXS_FAIL(kErrorInvalidArgument, -1);
    Decoded d;
    uint32_t code = kErrorNone;
    if (!DecodeUtf8(utf8, -1, &d.text, &d.length, &code)) GXS_FAIL(code, -1);
    return FindIn(mImpl->text, mImpl->length, d.text, d.length, false);
}

int GxString::ReverseFind(const wchar_t* needle) const {
    GXS_REQUIRE_CONSTRUCTED(-1);
    if (needle == nullptr) GXS_FAIL(kErrorInvalidArgument, -1);
    int n = WideLength(needle, mImpl->length + 1);
    return FindIn(mImpl->text, mImpl->length, needle, n, true);
}

int GxString::ReverseFind(const char* utf8) const {
    GXS_REQUIRE_CONSTRUCTED(-1);
    if (utf8 == nullptr) GXS_FAIL(kErrorInvalidArgument, -1);
    Decoded d;
    uint32_t code = kErrorNone;
    if (!DecodeUtf8(utf8, -1, &d.text, &d.length, &code)) GXS_FAIL(code, -1);
    return FindIn(mImpl->text, mImpl->length, d.text, d.length, true);
}

}  // namespace Glimmer

#pragma once
// GxString: the library's text type, a NUL-terminated string of 32-bit wide
// characters, one Unicode code point each, converted to UTF-8 or UTF-16 on
// demand.
//
// Two-phase: the default constructor makes an unconstructed string; one of the
// Construct forms makes it usable. Every operation on an unconstructed string
// fails with code 8; a second Construct fails with code 4 and keeps the first
// contents. Failures log "@ Native Error %ld : %d" under the tag "GxString".
//
// Byte strings (const char*) are UTF-8 whatever the process locale. Decoding
// also accepts what Java hands over as "modified UTF-8": a surrogate pair
// written as two 3-byte sequences becomes one code point, and a lone surrogate
// is kept as it is, so a Java string survives the trip to UTF-16 and back.
// Anything else that is not well-formed UTF-8 fails with code 7.

#include <cstdint>

static_assert(sizeof(wchar_t) == 4, "GxString holds one code point per wchar_t");

namespace Glimmer {

struct GxStringImpl;

class GxString {
public:
    // Longest string in characters: keeps the UTF-8 size (at most 6 bytes a
    // character plus the terminator) inside an int. Longer results fail with
    // code 2.
    static constexpr int kMaxLength = (INT32_MAX - 1) / 6;

    GxString();
    virtual ~GxString();
    GxString(const GxString&) = delete;
    GxString& operator=(const GxString&) = delete;

    bool Construct();
    bool Construct(const GxString* source);
    bool Construct(const wchar_t* source);
    bool Construct(const char* utf8);
    // The first `length` characters of the source (fewer if it is shorter);
    // a negative length fails with code 7.
    bool Construct(const GxString* source, int length);
    bool Construct(const wchar_t* source, int length);

    // Replace the contents; a null source empties the string and succeeds.
    bool Set(const GxString* source);
    bool Set(const wchar_t* source);
    bool Set(const char* utf8);
    bool Clear();

    // A null argument fails with code 7, an index outside 0..length with code 3.
    bool Append(const GxString* source);
    bool Append(const wchar_t* source);
    bool Append(const char* utf8);
    bool Insert(const wchar_t* source, int index);
    bool Insert(const GxString* source, int index);
    // Removes up to `count` characters from `index` (0..length, code 3;
    // a negative count, code 7).
    bool Remove(int index, int count);
    // Sets this string to up to `count` characters of `source` from `start`
    // (0..length of source, code 3; a negative count, code 7).
    bool SetSubstring(const GxString* source, int start, int count);

    int GetLength() const;                  // -1 when unconstructed
    const wchar_t* GetPointer() const;      // null when unconstructed
    bool GetChar(int index, wchar_t* out) const;

    // UTF-8 bytes including the terminator, counted per character: 1 below
    // 0x80, 2 below 0x800, 3 below 0x10000, 4 below 0x200000, 5 below
    // 0x4000000, else 6. -1 when unconstructed.
    int GetUTF8Size() const;
    // Writes whole characters into at most size - 1 bytes and terminates the
    // buffer (nothing is written when size is 0). Returns the bytes written
    // before the terminator, or -1: null buffer or negative size (code 7), or
    // a character no UTF-8 form can hold, at or above 0x80000000 (code 7; the
    // buffer then holds the text before it).
    int GetUTF8(char* buffer, int size) const;

    // UTF-16 units including the terminator: 1 per character below 0xFFFF or
    // above 0x10FFFF, 2 otherwise. U+FFFF itself deliberately counts, and is
    // written, as a pair. -1 when unconstructed.
    int GetUTF16Size() const;
    // A new UTF-16 copy, terminated; the caller frees it with delete[]. An
    // unconstructed string gives a buffer holding just 0. Null when out of
    // memory.
    uint16_t* GetUTF16() const;

    // Compares code points as unsigned values: -1, 0 or 1. A failure (this
    // string unconstructed, a null, unconstructed or ill-formed argument, a
    // negative count) reports its code and returns -1, never 0.
    int CompareTo(const GxString* other) const;
    int CompareTo(const char* utf8) const;
    // Only the first `count` characters of each side take part.
    int CompareTo(const char* utf8, int count) const;

    // Index of the first or last occurrence, or -1. An empty needle is found
    // at 0 (Find) or at the length (ReverseFind).
    int Find(const wchar_t* needle) const;
    int Find(const char* utf8) const;
    int ReverseFind(const wchar_t* needle) const;
    int ReverseFind(const char* utf8) const;

private:
    GxStringImpl* mImpl = nullptr;
};

}  // namespace Glimmer

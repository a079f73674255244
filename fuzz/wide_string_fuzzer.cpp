// The wide string's conversions: bytes decoded as UTF-8 (and Java's modified
// UTF-8), code points taken as they come, and every way back out (UTF-8,
// UTF-16, comparison, search, editing). Whatever is decoded must encode back
// to the same bytes when it was well-formed, and nothing may read or write
// past a buffer.

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "FuzzInput.h"
#include "foundation/GxString.h"

using Glimmer::GxString;

namespace {

void Exercise(GxString& s, Glimmer::Fuzz::Input& in) {
    const int utf8Size = s.GetUTF8Size();
    if (utf8Size > 0) {
        std::vector<char> out(static_cast<size_t>(utf8Size));
        s.GetUTF8(out.data(), utf8Size);
        const int cut = in.Below(utf8Size + 1);   // a short buffer: whole characters only
        std::vector<char> small(static_cast<size_t>(cut) + 1);
        s.GetUTF8(small.data(), cut);
    }
    delete[] s.GetUTF16();
    const std::string needle = in.Bytes(8);
    s.Find(needle.c_str());
    s.ReverseFind(needle.c_str());
    s.CompareTo(needle.c_str(), in.Count());
    GxString copy;
    if (copy.Construct(&s, in.Count())) {
        copy.Insert(&s, in.Count());
        copy.Remove(in.Count(), in.Count());
        GxString sub;
        if (sub.Construct()) sub.SetSubstring(&s, in.Count(), in.Count());
        copy.Append(needle.c_str());
        copy.CompareTo(&s);
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    Glimmer::Fuzz::Input in(data, size);
    const int form = in.Below(2);
    const std::string bytes = in.Bytes(255);
    GxString s;
    if (form == 0) {
        // UTF-8 or modified UTF-8: when taken, it encodes back to the same
        // bytes unless it held a surrogate pair written as two sequences.
        if (s.Construct(bytes.c_str())) {
            std::vector<char> out(static_cast<size_t>(s.GetUTF8Size()));
            const int written = s.GetUTF8(out.data(), int(out.size()));
            const bool pairs = bytes.find("\xED") != std::string::npos;
            if (!pairs && (written != int(std::strlen(bytes.c_str())) ||
                           std::memcmp(out.data(), bytes.c_str(), size_t(written)) != 0)) {
                std::abort();
            }
        }
    } else {
        // Any 32-bit values as code points, including those no UTF form holds.
        std::vector<wchar_t> points;
        for (size_t i = 0; i + 4 <= bytes.size(); i += 4) {
            uint32_t v;
            std::memcpy(&v, bytes.data() + i, 4);
            if (v != 0) points.push_back(wchar_t(v));
        }
        points.push_back(0);
        if (!s.Construct(points.data())) return 0;
    }
    if (s.GetLength() >= 0) Exercise(s, in);
    return 0;
}

#pragma once
// Reads a fuzzer's bytes as a stream of values. Past the end every read gives
// zeros, so any input is a complete program for a target.

#include <cfloat>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <string>

namespace Glimmer::Fuzz {

class Input {
public:
    Input(const uint8_t* data, size_t size) : data_(data), size_(size) {}

    size_t Remaining() const { return size_ - at_; }

    uint8_t Byte() { return at_ < size_ ? data_[at_++] : 0; }
    bool Bool() { return (Byte() & 1) != 0; }
    uint32_t U32() {
        uint32_t v = 0;
        for (int i = 0; i < 4; ++i) v = v << 8 | Byte();
        return v;
    }
    // 0..bound-1.
    int Below(int bound) { return bound <= 0 ? 0 : int(Byte() % unsigned(bound)); }
    // A signed count around the interesting small values, with a few
    // hostile ones (negative, huge).
    int Count() {
        static const int kOdd[] = {-1, -2147483647 - 1, 2147483647, 256, 257, 4096};
        const uint8_t b = Byte();
        return b < 250 ? int(b) - 2 : kOdd[b - 250];
    }
    // A float that is often hostile: NaN, infinities, huge, tiny, negative
    // zero; else one of the ordinary values a caller passes, or raw bits.
    float Float() {
        static const float kSpecial[] = {
            std::numeric_limits<float>::quiet_NaN(), INFINITY, -INFINITY, FLT_MAX, -FLT_MAX, FLT_MIN,
            FLT_TRUE_MIN, -0.0f, 0.0f, 1e30f, -1e30f, 2147483648.0f, -2147483904.0f, 65536.0f,
            0.5f, 1.0f, 2.0f, 5.0f, 10.0f, 45.0f, 90.0f, 100.0f, 120.0f, 360.0f, 1000.0f, -1.0f, -90.0f};
        constexpr int kCount = int(sizeof kSpecial / sizeof kSpecial[0]);
        const uint8_t b = Byte();
        if (b < kCount) return kSpecial[b];
        if (b < 200) return float(b - kCount) * 0.25f;   // small steps through the usual ranges
        const uint32_t bits = U32();
        float f;
        std::memcpy(&f, &bits, sizeof f);
        return f;
    }
    // Up to `max` bytes, as a string (its length first).
    std::string Bytes(size_t max) {
        size_t n = Byte();
        if (n > max) n = max;
        if (n > Remaining()) n = Remaining();
        std::string s(reinterpret_cast<const char*>(data_ + at_), n);
        at_ += n;
        return s;
    }
    // Everything left.
    const uint8_t* Rest(size_t* size) {
        *size = Remaining();
        const uint8_t* rest = data_ + at_;
        at_ = size_;
        return rest;
    }

private:
    const uint8_t* data_;
    size_t size_;
    size_t at_ = 0;
};

}  // namespace Glimmer::Fuzz

#pragma once

#include <cstdint>

namespace Glimmer {

// Integer rectangle; right and bottom are exclusive. Width and height are
// absolute differences, so a rectangle given with swapped corners still has a
// positive size.
class GxRect {
public:
    GxRect() = default;
    GxRect(int32_t l, int32_t t, int32_t r, int32_t b) : left(l), top(t), right(r), bottom(b) {}
    virtual ~GxRect() {}

    // Taken in unsigned arithmetic, so extreme corners cannot overflow: the
    // distance always fits 32 bits, and a bitmap reads it back as uint32.
    int32_t Width() const { return int32_t(Distance(left, right)); }
    int32_t Height() const { return int32_t(Distance(top, bottom)); }

    int32_t left = 0;
    int32_t top = 0;
    int32_t right = 0;
    int32_t bottom = 0;

private:
    static uint32_t Distance(int32_t a, int32_t b) {
        return a > b ? uint32_t(a) - uint32_t(b) : uint32_t(b) - uint32_t(a);
    }
};

}  // namespace Glimmer

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

    int32_t Width() const { return left > right ? left - right : right - left; }
    int32_t Height() const { return top > bottom ? top - bottom : bottom - top; }

    int32_t left = 0;
    int32_t top = 0;
    int32_t right = 0;
    int32_t bottom = 0;
};

}  // namespace Glimmer

#include "effect/GxScratch.h"

#include <cstdlib>
#include <cstring>

namespace Glimmer {

namespace {
constexpr size_t kAlignment = 64;  // a cache line, and every vector width we use
}

GxScratch::~GxScratch() { release(); }

void* GxScratch::get(Slot slot, size_t bytes, bool zeroed) {
    if (slot < 0 || slot >= kSlotCount) return nullptr;
    Block& b = blocks_[slot];
    if (bytes == 0) bytes = 1;
    if (bytes > b.bytes) {
        if (bytes > SIZE_MAX - kAlignment) return nullptr;
        // Some room to grow into, so that a text that gets a little longer
        // does not reallocate on every render.
        const size_t room = SIZE_MAX - kAlignment - bytes;
        size_t grown = bytes + (bytes / 8 < room ? bytes / 8 : room);
        grown = (grown + kAlignment - 1) / kAlignment * kAlignment;
        void* fresh = std::aligned_alloc(kAlignment, grown);
        if (fresh == nullptr) return nullptr;
        std::free(b.data);
        b.data = fresh;
        b.bytes = grown;
    }
    if (zeroed) std::memset(b.data, 0, bytes);
    return b.data;
}

void GxScratch::release() {
    for (Block& b : blocks_) {
        std::free(b.data);
        b = Block();
    }
}

size_t GxScratch::reservedBytes() const {
    size_t total = 0;
    for (const Block& b : blocks_) total += b.bytes;
    return total;
}

}  // namespace Glimmer

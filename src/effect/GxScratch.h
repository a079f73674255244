#pragma once
// Work memory that outlives a render. A text object draws the same size over
// and over; allocating its mask, work image, blur planes and result afresh
// every time costs about as much as drawing small ones. A GxScratch keeps one
// grow-only block per slot: a request no larger than what the slot holds
// returns the same memory, a larger one replaces it. After the first render of
// a size, renders of that size allocate nothing.
//
// Slots separate the buffers that are alive at the same time. A layer's slots
// are free again once its post-processing returns, so the layers of a stack
// take turns with the same few blocks. Contents are left as the last user
// left them unless the caller asks for zeros.

#include <cstddef>
#include <cstdint>

namespace Glimmer {

class GxScratch {
public:
    enum Slot : int {
        kPlaneA,  // a layer's planes and images
        kPlaneB,
        kPlaneC,
        kRows,    // a layer's row buffers and tables
        kLayerSlots,
        kMask = kLayerSlots,  // the stack's coverage mask
        kWorkImage,           // the stack's separate work image
        kSlotCount,
    };

    GxScratch() = default;
    ~GxScratch();
    GxScratch(const GxScratch&) = delete;
    GxScratch& operator=(const GxScratch&) = delete;

    // At least `bytes` bytes (64-byte aligned), zeroed when `zeroed`; null when
    // the slot cannot grow that far. The block stays valid until the next get()
    // of the same slot or release().
    void* get(Slot slot, size_t bytes, bool zeroed = false);
    template <typename T>
    T* get(Slot slot, size_t count, bool zeroed = false) {
        if (count > SIZE_MAX / sizeof(T)) return nullptr;
        return static_cast<T*>(get(slot, count * sizeof(T), zeroed));
    }

    // Every block goes.
    void release();
    size_t reservedBytes() const;

private:
    struct Block {
        void* data = nullptr;
        size_t bytes = 0;
    };
    Block blocks_[kSlotCount];
};

}  // namespace Glimmer

// List keeps a doubly linked chain of nodes, each holding one item pointer.
// Indexed access remembers the last node it reached, so that walking a list
// with Get(0), Get(1), ... costs one step per call; the walk starts from
// whichever of the first node, the last node and the remembered one is
// nearest.
//
// The remembered node is the caller's, not the list's: each thread keeps a
// few (list, index, node) memos of its own. Get is a read, and a list read by
// several threads at once (the font manager's families while texts render
// side by side under a shared lock) must not be written by those reads; a
// memo inside the list was, and one reader's index paired with another's
// node walked off the chain. A memo names its list by a stamp that no list
// ever had before, renewed by every change to the chain, so a memo of a
// changed or freed list is never used. Changes still need the caller's
// exclusive access, as before.
//
// Traversal cursors live in a table of ten slots. A cursor is handed out as
// the address of its heap cell, but it is only ever dereferenced after it has
// been found in the table, so a stale handle is an error, never a wild read.
// A cursor on a node that is being removed steps on to the next node, which
// makes "remove the current item, then carry on" work as expected.

#include "foundation/List.h"

#include <atomic>
#include <cstdint>
#include <new>

#include "foundation/Error.h"

namespace Glimmer {

namespace {
constexpr const char* kTag = "List";

struct ListNode {
    ListNode* prev = nullptr;
    ListNode* next = nullptr;
    void* item = nullptr;
};

// Stamps for chains: process-wide, never reused (64 bits do not wrap).
std::atomic<uint64_t> gNextStamp{1};
uint64_t NewStamp() { return gNextStamp.fetch_add(1, std::memory_order_relaxed); }

// This thread's last few positions in lists (nested walks use two or three).
struct WalkMemo {
    uint64_t stamp = 0;
    int index = 0;
    ListNode* node = nullptr;
};
constexpr int kWalkMemos = 4;
thread_local WalkMemo tWalkMemos[kWalkMemos];
thread_local int tNextWalkMemo = 0;

struct ListCursor {
    ListNode* node = nullptr;  // null: past either end
};

// A run of new nodes not yet linked into a list.
struct Chain {
    ListNode* first = nullptr;
    ListNode* last = nullptr;
    int count = 0;

    bool Push(void* item) {
        auto* node = new (std::nothrow) ListNode;
        if (node == nullptr) return false;
        node->item = item;
        node->prev = last;
        (last != nullptr ? last->next : first) = node;
        last = node;
        ++count;
        return true;
    }
    void Free() {
        while (first != nullptr) {
            ListNode* next = first->next;
            delete first;
            first = next;
        }
        last = nullptr;
        count = 0;
    }
};
}  // namespace

struct ListImpl {
    ListNode* first = nullptr;
    ListNode* last = nullptr;
    int count = 0;
    int traversals = 0;
    ListCursor* cursors[List::kMaxTraversals] = {};
    uint64_t stamp = NewStamp();

    // After any change to the chain: memos of it become stale.
    void Forget() { stamp = NewStamp(); }

    // Links `chain` in before `at` (at the end when `at` is null).
    void Splice(Chain& chain, ListNode* at) {
        if (chain.first == nullptr) return;
        ListNode* before = at != nullptr ? at->prev : last;
        chain.first->prev = before;
        chain.last->next = at;
        (before != nullptr ? before->next : first) = chain.first;
        (at != nullptr ? at->prev : last) = chain.last;
        count += chain.count;
        chain = Chain();
        Forget();
    }

    void Unlink(ListNode* node) {
        for (ListCursor* cursor : cursors) {
            if (cursor != nullptr && cursor->node == node) cursor->node = node->next;
        }
        (node->prev != nullptr ? node->prev->next : first) = node->next;
        (node->next != nullptr ? node->next->prev : last) = node->prev;
        delete node;
        --count;
        Forget();
    }

    void FreeNodes() {
        Chain all;
        all.first = first;
        all.Free();
        first = last = nullptr;
        count = 0;
        for (ListCursor* cursor : cursors) {
            if (cursor != nullptr) cursor->node = nullptr;
        }
        Forget();
    }

    // The node at a valid index.
    ListNode* NodeAt(int index) const {
        ListNode* node = first;
        int at = 0;
        int distance = index;
        if (count - 1 - index < distance) {
            node = last, at = count - 1, distance = count - 1 - index;
        }
        WalkMemo* memo = nullptr;
        for (WalkMemo& m : tWalkMemos) {
            if (m.stamp == stamp) memo = &m;
        }
        if (memo != nullptr) {
            int fromMemo = memo->index > index ? memo->index - index : index - memo->index;
            if (fromMemo < distance) node = memo->node, at = memo->index;
        } else {
            memo = &tWalkMemos[tNextWalkMemo];
            tNextWalkMemo = (tNextWalkMemo + 1) % kWalkMemos;
            memo->stamp = stamp;
        }
        for (; at < index; ++at) node = node->next;
        for (; at > index; --at) node = node->prev;
        memo->index = index;
        memo->node = node;
        return node;
    }

    ListNode* Find(void* item) const {
        for (ListNode* node = first; node != nullptr; node = node->next) {
            if (node->item == item) return node;
        }
        return nullptr;
    }

    ListCursor* CursorFor(long handle) const {
        for (ListCursor* cursor : cursors) {
            if (cursor != nullptr && reinterpret_cast<long>(cursor) == handle) return cursor;
        }
        return nullptr;
    }
};

#define LIST_FAIL(code, value)         \
    do {                               \
        GX_REPORT_ERROR(kTag, (code)); \
        return value;                  \
    } while (0)
#define LIST_REQUIRE_CONSTRUCTED(value) \
    if (mImpl == nullptr) LIST_FAIL(kErrorNotConstructed, value)
#define LIST_CURSOR(name, handle, value)                           \
    ListCursor* name = mImpl->CursorFor(handle);                   \
    if (name == nullptr) LIST_FAIL(kErrorInvalidArgument, value)

List::List() = default;

List::~List() {
    if (mImpl == nullptr) return;
    mImpl->FreeNodes();
    for (ListCursor*& cursor : mImpl->cursors) {
        delete cursor;
        cursor = nullptr;
    }
    delete mImpl;
}

// ---- Construction ----------------------------------------------------------

bool List::Construct() {
    if (mImpl != nullptr) LIST_FAIL(kErrorAlreadyConstructed, false);
    mImpl = new (std::nothrow) ListImpl;
    if (mImpl == nullptr) LIST_FAIL(kErrorSystemCall, false);
    return true;
}

bool List::Construct(const List* other) {
    if (mImpl != nullptr) LIST_FAIL(kErrorAlreadyConstructed, false);
    if (other == nullptr) LIST_FAIL(kErrorInvalidArgument, false);
    if (other->mImpl == nullptr) LIST_FAIL(kErrorNotConstructed, false);
    Chain chain;
    for (ListNode* node = other->mImpl->first; node != nullptr; node = node->next) {
        if (!chain.Push(node->item)) {
            chain.Free();
            LIST_FAIL(kErrorSystemCall, false);
        }
    }
    mImpl = new (std::nothrow) ListImpl;
    if (mImpl == nullptr) {
        chain.Free();
        LIST_FAIL(kErrorSystemCall, false);
    }
    mImpl->Splice(chain, nullptr);
    return true;
}

bool List::Construct(void** items, int count) {
    if (mImpl != nullptr) LIST_FAIL(kErrorAlreadyConstructed, false);
    if (count < 0 || (items == nullptr && count > 0)) LIST_FAIL(kErrorInvalidArgument, false);
    for (int i = 0; i < count; ++i) {
        if (items[i] == nullptr) LIST_FAIL(kErrorInvalidArgument, false);
    }
    Chain chain;
    for (int i = 0; i < count; ++i) {
        if (!chain.Push(items[i])) {
            chain.Free();
            LIST_FAIL(kErrorSystemCall, false);
        }
    }
    mImpl = new (std::nothrow) ListImpl;
    if (mImpl == nullptr) {
        chain.Free();
        LIST_FAIL(kErrorSystemCall, false);
    }
    mImpl->Splice(chain, nullptr);
    return true;
}

// ---- Editing ---------------------------------------------------------------

bool List::Add(void* item) {
    LIST_REQUIRE_CONSTRUCTED(false);
    if (item == nullptr) LIST_FAIL(kErrorInvalidArgument, false);
    Chain chain;
    if (!chain.Push(item)) LIST_FAIL(kErrorSystemCall, false);
    mImpl->Splice(chain, nullptr);
    return true;
}

bool List::Add(const List* other) {
    LIST_REQUIRE_CONSTRUCTED(false);
    if (other == nullptr) LIST_FAIL(kErrorInvalidArgument, false);
    if (other->mImpl == nullptr) LIST_FAIL(kErrorNotConstructed, false);
    // Copied aside first, so adding a list to itself doubles it once.
    Chain chain;
    for (ListNode* node = other->mImpl->first; node != nullptr; node = node->next) {
        if (!chain.Push(node->item)) {
            chain.Free();
            LIST_FAIL(kErrorSystemCall, false);
        }
    }
    mImpl->Splice(chain, nullptr);
    return true;
}

bool List::Insert(void* item, int index) {
    LIST_REQUIRE_CONSTRUCTED(false);
    if (item == nullptr) LIST_FAIL(kErrorInvalidArgument, false);
    if (index < 0 || index > mImpl->count) LIST_FAIL(kErrorIndexOutOfRange, false);
    ListNode* at = index == mImpl->count ? nullptr : mImpl->NodeAt(index);
    Chain chain;
    if (!chain.Push(item)) LIST_FAIL(kErrorSystemCall, false);
    mImpl->Splice(chain, at);
    return true;
}

bool List::Remove(void* item) {
    LIST_REQUIRE_CONSTRUCTED(false);
    if (item == nullptr) LIST_FAIL(kErrorInvalidArgument, false);
    ListNode* node = mImpl->Find(item);
    if (node == nullptr) LIST_FAIL(kErrorNotFound, false);
    mImpl->Unlink(node);
    return true;
}

bool List::Remove(int index) {
    LIST_REQUIRE_CONSTRUCTED(false);
    if (index < 0 || index >= mImpl->count) LIST_FAIL(kErrorIndexOutOfRange, false);
    mImpl->Unlink(mImpl->NodeAt(index));
    return true;
}

bool List::Remove(int index, int count) {
    LIST_REQUIRE_CONSTRUCTED(false);
    if (count < 0) LIST_FAIL(kErrorInvalidArgument, false);
    if (index < 0 || count > mImpl->count - index) LIST_FAIL(kErrorIndexOutOfRange, false);
    if (count == 0) return true;
    ListNode* node = mImpl->NodeAt(index);
    for (int i = 0; i < count; ++i) {
        ListNode* next = node->next;
        mImpl->Unlink(node);
        node = next;
    }
    return true;
}

bool List::RemoveAll() {
    LIST_REQUIRE_CONSTRUCTED(false);
    mImpl->FreeNodes();
    return true;
}

// ---- Queries ---------------------------------------------------------------

int List::GetCount() const {
    LIST_REQUIRE_CONSTRUCTED(-1);
    return mImpl->count;
}

void* List::Get(int index) const {
    LIST_REQUIRE_CONSTRUCTED(nullptr);
    if (index < 0 || index >= mImpl->count) LIST_FAIL(kErrorIndexOutOfRange, nullptr);
    return mImpl->NodeAt(index)->item;
}

int List::GetIndex(void* item) const {
    LIST_REQUIRE_CONSTRUCTED(-1);
    int index = 0;
    for (ListNode* node = mImpl->first; node != nullptr; node = node->next, ++index) {
        if (node->item == item) return index;
    }
    return -1;
}

bool List::IsContained(void* item) const {
    LIST_REQUIRE_CONSTRUCTED(false);
    return item != nullptr && mImpl->Find(item) != nullptr;
}

bool List::IsContained(const List* other) const {
    LIST_REQUIRE_CONSTRUCTED(false);
    if (other == nullptr) LIST_FAIL(kErrorInvalidArgument, false);
    if (other->mImpl == nullptr) LIST_FAIL(kErrorNotConstructed, false);
    for (ListNode* node = other->mImpl->first; node != nullptr; node = node->next) {
        if (mImpl->Find(node->item) == nullptr) return false;
    }
    return true;
}

// ---- Traversal -------------------------------------------------------------

long List::BeginTraversal() {
    LIST_REQUIRE_CONSTRUCTED(-1);
    for (ListCursor*& slot : mImpl->cursors) {
        if (slot != nullptr) continue;
        slot = new (std::nothrow) ListCursor;
        if (slot == nullptr) LIST_FAIL(kErrorSystemCall, -1);
        slot->node = mImpl->first;
        ++mImpl->traversals;
        return reinterpret_cast<long>(slot);
    }
    LIST_FAIL(kErrorLimitReached, -1);
}

void* List::GetData(long handle) const {
    LIST_REQUIRE_CONSTRUCTED(nullptr);
    LIST_CURSOR(cursor, handle, nullptr);
    return cursor->node != nullptr ? cursor->node->item : nullptr;
}

void* List::NextData(long handle) { return Move(handle, 1); }

void* List::PrevData(long handle) { return Move(handle, -1); }

void* List::MoveFirst(long handle) {
    LIST_REQUIRE_CONSTRUCTED(nullptr);
    LIST_CURSOR(cursor, handle, nullptr);
    cursor->node = mImpl->first;
    return cursor->node != nullptr ? cursor->node->item : nullptr;
}

void* List::MoveLast(long handle) {
    LIST_REQUIRE_CONSTRUCTED(nullptr);
    LIST_CURSOR(cursor, handle, nullptr);
    cursor->node = mImpl->last;
    return cursor->node != nullptr ? cursor->node->item : nullptr;
}

void* List::Move(long handle, int steps) {
    LIST_REQUIRE_CONSTRUCTED(nullptr);
    LIST_CURSOR(cursor, handle, nullptr);
    ListNode* node = cursor->node;
    for (; steps > 0 && node != nullptr; --steps) node = node->next;
    for (; steps < 0 && node != nullptr; ++steps) node = node->prev;
    cursor->node = node;
    return node != nullptr ? node->item : nullptr;
}

bool List::EndTraversal(long handle) {
    LIST_REQUIRE_CONSTRUCTED(false);
    for (ListCursor*& slot : mImpl->cursors) {
        if (slot != nullptr && reinterpret_cast<long>(slot) == handle) {
            delete slot;
            slot = nullptr;
            --mImpl->traversals;
            return true;
        }
    }
    LIST_FAIL(kErrorInvalidArgument, false);
}

}  // namespace Glimmer

#pragma once
// List: an ordered, doubly linked list of untyped item pointers. It never owns
// the items; callers free them.
//
// Two-phase like the other foundation classes: a second Construct fails with
// code 4, any use before Construct with code 8; failures log
// "@ Native Error %ld : %d" under the tag "List". Items are never null (adding
// null fails with code 7), so a null result always means "no item".
//
// Traversal: up to 10 cursors may be open at once (an 11th BeginTraversal
// fails with code 2). A cursor is an opaque `long`; every call checks it
// against the open ones, so a stale or made-up cursor fails with code 7 rather
// than touching memory. Removing the item a cursor stands on moves that cursor
// to the next item (or past the end); RemoveAll moves every cursor past the
// end. Moving past either end leaves the cursor on no item until MoveFirst or
// MoveLast.

namespace Glimmer {

struct ListImpl;

class List {
public:
    static constexpr int kMaxTraversals = 10;

    List();
    virtual ~List();
    List(const List&) = delete;
    List& operator=(const List&) = delete;

    bool Construct();
    bool Construct(const List* other);           // copies the item pointers
    bool Construct(void** items, int count);

    bool Add(void* item);                        // at the end
    bool Add(const List* other);                 // all of other's items, in order
    bool Insert(void* item, int index);          // index 0..count (code 3)
    bool Remove(void* item);                     // first occurrence; absent: code 9
    bool Remove(int index);                      // index 0..count-1 (code 3)
    bool Remove(int index, int count);           // the range must lie inside (code 3)
    bool RemoveAll();

    int GetCount() const;                        // -1 when unconstructed
    void* Get(int index) const;                  // null and code 3 outside 0..count-1
    int GetIndex(void* item) const;              // -1 when absent (no error)
    bool IsContained(void* item) const;
    bool IsContained(const List* other) const;   // every item of other is here

    long BeginTraversal();                       // -1 on failure
    void* GetData(long cursor) const;            // the item under the cursor, or null
    // Each move returns the item the cursor lands on, or null past the ends.
    void* NextData(long cursor);
    void* PrevData(long cursor);
    void* MoveFirst(long cursor);
    void* MoveLast(long cursor);
    void* Move(long cursor, int steps);          // forward, or backward when negative
    bool EndTraversal(long cursor);

private:
    ListImpl* mImpl = nullptr;
};

}  // namespace Glimmer

#include <gtest/gtest.h>

#include <memory>
#include <vector>

#include "foundation/Error.h"
#include "foundation/List.h"
#include "support/LogCapture.h"

namespace Glimmer {
namespace {

int gItems[16];
void* Item(int i) { return &gItems[i]; }

using Testing::CodeOf;

// The items as indexes into gItems, read through Get (which remembers its place)
// and checked against a plain walk with a cursor.
std::vector<int> Contents(List& list) {
    std::vector<int> viaGet, viaCursor;
    for (int i = 0; i < list.GetCount(); ++i) viaGet.push_back(int(static_cast<int*>(list.Get(i)) - gItems));
    long cursor = list.BeginTraversal();
    for (void* p = list.GetData(cursor); p != nullptr; p = list.NextData(cursor)) {
        viaCursor.push_back(int(static_cast<int*>(p) - gItems));
    }
    list.EndTraversal(cursor);
    EXPECT_EQ(viaGet, viaCursor);
    return viaGet;
}

TEST(List, EditsInOrderAndRefusesBadArgumentsWithTheirCodes) {
    Testing::LogCapture capture;
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(List().GetCount(), -1); }), 8);
    EXPECT_EQ(capture.CountErrors("List", 8), 1);
    void* items[] = {Item(0), Item(1), Item(2)};
    List list, copy;
    ASSERT_TRUE(list.Construct(items, 3));
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.Construct()); }), 4);
    EXPECT_TRUE(list.Insert(Item(5), 0));
    EXPECT_TRUE(list.Insert(Item(6), 4));   // at the end
    ASSERT_TRUE(copy.Construct(&list));
    EXPECT_TRUE(list.Add(&list));   // appending a list to itself doubles it once
    EXPECT_TRUE(list.Remove(5, 5));
    EXPECT_TRUE(list.Remove(Item(1)));
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.Remove(Item(7))); }), 9);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.Remove(3, 2)); }), 3);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(list.Get(-1), nullptr); }), 3);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.Add(static_cast<void*>(nullptr))); }), 7);
    EXPECT_EQ(Contents(list), (std::vector<int>{5, 0, 2, 6}));
    EXPECT_EQ(Contents(copy), (std::vector<int>{5, 0, 1, 2, 6}));   // kept its own nodes
}

// Get remembers where it was, per thread and per list; edits in between, walks
// of other lists (more than it remembers) and a list made anew, perhaps at a
// freed one's address, must not leave it stale. Checked against a vector.
TEST(List, IndexedAccessAgreesWithAModelAfterRandomEdits) {
    constexpr int kLists = 6;
    std::unique_ptr<List> lists[kLists];
    std::vector<int> models[kLists];
    for (auto& list : lists) {
        list = std::make_unique<List>();
        ASSERT_TRUE(list->Construct());
    }
    unsigned seed = 1;
    auto next = [&] { return (seed = seed * 1103515245u + 12345u) >> 16; };
    for (int step = 0; step < 6000; ++step) {
        const int k = int(next() % kLists);
        List& list = *lists[k];
        std::vector<int>& model = models[k];
        const int count = int(model.size());
        const unsigned op = next() % 9;
        if (op < 3) {
            const int at = int(next() % unsigned(count + 1)), item = int(next() % 16);
            ASSERT_TRUE(list.Insert(Item(item), at));
            model.insert(model.begin() + at, item);
        } else if (op == 3 && count > 0) {
            const int at = int(next() % unsigned(count));
            ASSERT_TRUE(list.Remove(at));
            model.erase(model.begin() + at);
        } else if (op == 4 && next() % 8 == 0) {
            lists[k].reset();   // first, so that the new one may take its address
            lists[k] = std::make_unique<List>();
            ASSERT_TRUE(lists[k]->Construct());
            model.clear();
        } else if (op > 4 && count > 0) {
            const int at = int(next() % unsigned(count));
            ASSERT_EQ(list.Get(at), Item(model[size_t(at)])) << "step " << step;
        }
    }
    for (int k = 0; k < kLists; ++k) EXPECT_EQ(Contents(*lists[k]), models[k]);
}

TEST(List, CursorsAreCheckedLimitedToTenAndSurviveRemoval) {
    List list;
    ASSERT_TRUE(list.Construct());
    for (int i = 0; i < 5; ++i) ASSERT_TRUE(list.Add(Item(i)));
    std::vector<long> cursors;
    for (int i = 0; i < 10; ++i) cursors.push_back(list.BeginTraversal());
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(list.BeginTraversal(), -1); }), 2);
    EXPECT_TRUE(list.EndTraversal(cursors[1]));
    // A cursor that was ended, or never handed out, is refused, not followed.
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.EndTraversal(cursors[1])); }), 7);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(list.NextData(12345), nullptr); }), 7);

    const long c = cursors[0];
    EXPECT_EQ(list.Move(c, 3), Item(3));
    EXPECT_EQ(list.PrevData(c), Item(2));
    EXPECT_EQ(list.Move(c, -3), nullptr);   // off the front: stays off
    EXPECT_EQ(list.NextData(c), nullptr);
    EXPECT_EQ(list.MoveLast(c), Item(4));
    // Removing under an open cursor moves it on to the next item.
    EXPECT_EQ(list.Move(c, -2), Item(2));
    EXPECT_TRUE(list.Remove(Item(2)));
    EXPECT_EQ(list.GetData(c), Item(3));
    EXPECT_TRUE(list.Remove(2, 2));   // 3 and 4
    EXPECT_EQ(list.GetData(c), nullptr);
    EXPECT_EQ(list.MoveFirst(c), Item(0));
    EXPECT_TRUE(list.RemoveAll());
    EXPECT_EQ(list.GetData(c), nullptr);
}

}  // namespace
}  // namespace Glimmer

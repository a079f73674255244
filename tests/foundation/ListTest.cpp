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

TEST(List, UnconstructedAndTwiceConstructed) {
    Testing::LogCapture capture;
    List list;
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(list.GetCount(), -1); }), 8);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.Add(Item(0))); }), 8);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(list.BeginTraversal(), -1); }), 8);
    EXPECT_EQ(capture.Lines().size(), 3u);
    for (const auto& line : capture.Lines()) EXPECT_EQ(line.tag, "List");

    ASSERT_TRUE(list.Construct());
    ASSERT_TRUE(list.Add(Item(1)));
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.Construct()); }), 4);
    EXPECT_EQ(Contents(list), (std::vector<int>{1}));

    List other;
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.Add(&other)); }), 8);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(List().Construct(&other)); }), 8);
}

TEST(List, BuildsAndEditsInOrder) {
    void* items[] = {Item(0), Item(1), Item(2)};
    List list;
    ASSERT_TRUE(list.Construct(items, 3));
    EXPECT_TRUE(list.Insert(Item(5), 0));
    EXPECT_TRUE(list.Insert(Item(6), 4));  // at the end
    EXPECT_TRUE(list.Insert(Item(7), 2));
    EXPECT_EQ(Contents(list), (std::vector<int>{5, 0, 7, 1, 2, 6}));

    List copy;
    ASSERT_TRUE(copy.Construct(&list));
    EXPECT_TRUE(list.Add(&list));  // appending a list to itself doubles it once
    EXPECT_EQ(list.GetCount(), 12);
    EXPECT_TRUE(list.Remove(6, 6));
    EXPECT_EQ(Contents(list), Contents(copy));

    EXPECT_TRUE(list.Remove(Item(7)));
    EXPECT_TRUE(list.Remove(0));
    EXPECT_TRUE(list.Remove(1, 2));
    EXPECT_EQ(Contents(list), (std::vector<int>{0, 6}));
    EXPECT_EQ(list.GetIndex(Item(6)), 1);
    EXPECT_EQ(list.GetIndex(Item(7)), -1);
    EXPECT_FALSE(list.IsContained(&copy));
    EXPECT_TRUE(copy.IsContained(&list));

    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.Remove(Item(7))); }), 9);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.Remove(1, 2)); }), 3);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.Insert(Item(1), 3)); }), 3);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(list.Get(-1), nullptr); }), 3);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.Add(static_cast<void*>(nullptr))); }), 7);
    EXPECT_TRUE(list.Remove(2, 0));  // an empty range at the end is fine
    EXPECT_EQ(Contents(list), (std::vector<int>{0, 6}));

    EXPECT_TRUE(list.RemoveAll());
    EXPECT_EQ(Contents(list), std::vector<int>{});
    EXPECT_EQ(Contents(copy), (std::vector<int>{5, 0, 7, 1, 2, 6}));  // kept its own nodes
}

TEST(List, IndexedAccessAgreesWithAWalkAfterEdits) {
    // Get remembers where it was, per thread and per list; edits in between,
    // walks of other lists (more than it remembers) and a list made anew,
    // perhaps at a freed one's address, must not leave it stale.
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
        int count = int(model.size());
        switch (next() % 9) {
            case 0:
            case 1:
            case 2: {
                int at = int(next() % unsigned(count + 1));
                int item = int(next() % 16);
                ASSERT_TRUE(list.Insert(Item(item), at));
                model.insert(model.begin() + at, item);
                break;
            }
            case 3:
                if (count > 0) {
                    int at = int(next() % unsigned(count));
                    ASSERT_TRUE(list.Remove(at));
                    model.erase(model.begin() + at);
                }
                break;
            case 4:
                if (next() % 8 == 0) {
                    lists[k].reset();
                    lists[k] = std::make_unique<List>();
                    ASSERT_TRUE(lists[k]->Construct());
                    model.clear();
                }
                break;
            default:
                if (count > 0) {
                    int at = int(next() % unsigned(count));
                    ASSERT_EQ(list.Get(at), Item(model[size_t(at)])) << "step " << step;
                }
        }
    }
    for (int k = 0; k < kLists; ++k) EXPECT_EQ(Contents(*lists[k]), models[k]);
}

TEST(List, TenTraversalsAtMost) {
    List list;
    ASSERT_TRUE(list.Construct());
    ASSERT_TRUE(list.Add(Item(0)));
    std::vector<long> cursors;
    for (int i = 0; i < 10; ++i) {
        cursors.push_back(list.BeginTraversal());
        ASSERT_NE(cursors.back(), -1);
    }
    Testing::LogCapture capture;
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(list.BeginTraversal(), -1); }), 2);
    EXPECT_EQ(capture.Lines().size(), 1u);
    EXPECT_TRUE(list.EndTraversal(cursors[3]));
    long again = list.BeginTraversal();
    EXPECT_NE(again, -1);
    EXPECT_EQ(list.GetData(again), Item(0));

    // A cursor that was ended, or never handed out, is refused, not followed.
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(list.EndTraversal(12345)); }), 7);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(list.GetData(-1), nullptr); }), 7);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(list.NextData(0), nullptr); }), 7);
    // Destruction frees the cursors still open.
}

TEST(List, CursorsMoveBothWaysAndSurviveRemoval) {
    List list;
    ASSERT_TRUE(list.Construct());
    for (int i = 0; i < 5; ++i) ASSERT_TRUE(list.Add(Item(i)));
    long c = list.BeginTraversal();
    EXPECT_EQ(list.GetData(c), Item(0));
    EXPECT_EQ(list.Move(c, 3), Item(3));
    EXPECT_EQ(list.PrevData(c), Item(2));
    EXPECT_EQ(list.MoveLast(c), Item(4));
    EXPECT_EQ(list.Move(c, -4), Item(0));
    EXPECT_EQ(list.Move(c, 0), Item(0));
    EXPECT_EQ(list.PrevData(c), nullptr);  // off the front: stays off
    EXPECT_EQ(list.NextData(c), nullptr);
    EXPECT_EQ(list.MoveFirst(c), Item(0));
    EXPECT_EQ(list.Move(c, 9), nullptr);

    // Removing under an open cursor moves it on to the next item.
    long d = list.BeginTraversal();
    EXPECT_EQ(list.Move(d, 2), Item(2));
    EXPECT_TRUE(list.Remove(Item(2)));
    EXPECT_EQ(list.GetData(d), Item(3));
    EXPECT_TRUE(list.Remove(1, 3));  // 1, 3, 4
    EXPECT_EQ(list.GetData(d), nullptr);
    EXPECT_EQ(list.MoveLast(d), Item(0));

    // Remove-as-you-go over the whole list.
    for (int i = 0; i < 4; ++i) ASSERT_TRUE(list.Add(Item(10 + i)));
    long e = list.BeginTraversal();
    std::vector<void*> seen;
    for (void* p = list.GetData(e); p != nullptr; p = list.GetData(e)) {
        seen.push_back(p);
        ASSERT_TRUE(list.Remove(p));
    }
    EXPECT_EQ(seen.size(), 5u);
    EXPECT_EQ(list.GetCount(), 0);

    ASSERT_TRUE(list.Add(Item(1)));
    EXPECT_EQ(list.MoveFirst(d), Item(1));
    EXPECT_TRUE(list.RemoveAll());
    EXPECT_EQ(list.GetData(d), nullptr);
    EXPECT_TRUE(list.EndTraversal(c));
    EXPECT_TRUE(list.EndTraversal(d));
    EXPECT_TRUE(list.EndTraversal(e));
}

}  // namespace
}  // namespace Glimmer

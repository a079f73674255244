#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <random>
#include <thread>
#include <vector>

#include "foundation/Error.h"
#include "support/LogCapture.h"
#include "text/GxTextInstanceManager.h"
#include "text/GxTextObject.h"

namespace Glimmer {
namespace {

using Registry = GxTextInstanceManager;

std::atomic<int> gLive{0};
std::vector<int>* gDeleted = new std::vector<int>();   // tags of deleted objects, in order

// A text object that counts itself and says when it goes.
class TaggedText : public GxTextObject {
public:
    explicit TaggedText(int tag = 0) : tag_(tag) { ++gLive; }
    ~TaggedText() override {
        --gLive;
        if (tag_ != 0) gDeleted->push_back(tag_);
    }

private:
    int tag_;
};

TaggedText* NewText(int tag = 0) {
    auto* text = new TaggedText(tag);
    text->Construct();
    return text;
}

// The handle the first text object of the process got, taken before any test.
int gFirstHandle = 0;

class FirstHandle : public ::testing::Environment {
public:
    void SetUp() override {
        if (gFirstHandle != 0) return;   // a repeated run keeps the first one
        GxTextObject text;
        text.Construct();
        gFirstHandle = text.GetRuntimeHandle();
    }
};

[[maybe_unused]] ::testing::Environment* const gFirstHandleEnvironment =
    ::testing::AddGlobalTestEnvironment(new FirstHandle);

TEST(GxTextInstanceManagerTest, HandlesStartAtOneAndAreNeverReused) {
    EXPECT_EQ(gFirstHandle, 1);
    TaggedText* a = NewText();
    const int handle = a->GetRuntimeHandle();
    EXPECT_EQ(Registry::Register(a), handle);   // again: same handle, no new one
    delete a;   // the destructor unregisters
    EXPECT_EQ(Registry::FindGxTextObject(handle), nullptr);
    TaggedText* b = NewText();
    EXPECT_EQ(b->GetRuntimeHandle(), handle + 1);
    delete b;
}

TEST(GxTextInstanceManagerTest, TheLastReleaseDeletesAndTheUnknownFailWithCode9) {
    const int before = gLive;
    TaggedText* text = NewText();
    Registry::Bind(text);
    Registry::Bind(text);
    EXPECT_TRUE(Registry::Release(text->GetRuntimeHandle()));
    EXPECT_EQ(gLive, before + 1);
    EXPECT_TRUE(Registry::Release(text, false));   // the count reaches 0, the object stays
    EXPECT_EQ(gLive, before + 1);
    EXPECT_TRUE(Registry::Release(text, true));
    EXPECT_EQ(gLive, before);

    Testing::LogCapture log;
    EXPECT_EQ(Testing::CodeOf([] { EXPECT_FALSE(Registry::Release(-5)); }), 9);
    TaggedText unbound;
    EXPECT_EQ(Testing::CodeOf([&] { EXPECT_FALSE(Registry::Release(&unbound, true)); }), 9);
    EXPECT_EQ(log.CountErrors("GxTextInstanceManager", 9), 2);
    EXPECT_EQ(Registry::FindGxTextObject(123456789), nullptr);
    EXPECT_EQ(log.Count("GxTextInstanceManager", "FindGxTextObject() - Can't find the handle[123456789]"), 1);
}

TEST(GxTextInstanceManagerTest, DeletionsWaitBetweenLockAndUnlock) {
    gDeleted->clear();
    TaggedText* a = NewText(1);
    TaggedText* b = NewText(2);
    TaggedText* c = NewText(3);
    const int handleA = a->GetRuntimeHandle();
    for (TaggedText* text : {a, b, c}) Registry::Bind(text);

    Registry::Lock();
    for (TaggedText* text : {c, b, a}) EXPECT_TRUE(Registry::Release(text, true));
    EXPECT_TRUE(gDeleted->empty());
    EXPECT_EQ(Registry::FindGxTextObject(handleA), a);   // still findable while queued
    Registry::Bind(b);                                     // rescued
    Registry::Unlock();
    EXPECT_EQ(*gDeleted, (std::vector<int>{3, 1}));        // queue order
    EXPECT_EQ(Registry::FindGxTextObject(handleA), nullptr);

    EXPECT_TRUE(Registry::Release(b, true));              // not locked any more
    EXPECT_EQ(*gDeleted, (std::vector<int>{3, 1, 2}));
}

// Several threads binding, finding and releasing at once, with another one
// looking up arbitrary handles and locking and unlocking the registry.
TEST(GxTextInstanceManagerTest, BindingFindingAndReleasingHoldUpUnderThreads) {
    const int before = gLive;
    constexpr int kWorkers = 4;
    constexpr int kRounds = 300;
    std::atomic<bool> done{false};
    std::atomic<int> highest{0};
    std::vector<std::vector<int>> handles(kWorkers);
    std::atomic<int> mismatches{0};

    std::vector<std::thread> threads;
    for (int w = 0; w < kWorkers; ++w) {
        threads.emplace_back([&, w] {
            for (int round = 0; round < kRounds; ++round) {
                TaggedText* text = NewText();
                const int handle = text->GetRuntimeHandle();
                handles[size_t(w)].push_back(handle);
                highest = std::max(highest.load(), handle);
                Registry::Bind(text);
                Registry::Bind(text);
                if (Registry::FindGxTextObject(handle) != text) ++mismatches;
                if (Registry::FindGxTextHandle(text) != handle) ++mismatches;
                if (!Registry::Release(handle)) ++mismatches;
                if (Registry::FindGxTextObject(handle) != text) ++mismatches;
                if (!Registry::Release(text, true)) ++mismatches;
            }
        });
    }
    threads.emplace_back([&] {   // looks up arbitrary handles, locking and unlocking in between
        std::mt19937 random(5);
        while (!done) {
            Registry::FindGxTextObject(int(random() % unsigned(std::max(1, highest.load()))) + 1);
            Registry::Lock();
            std::this_thread::yield();
            Registry::Unlock();
        }
    });
    for (int w = 0; w < kWorkers; ++w) threads[size_t(w)].join();
    done = true;
    threads.back().join();
    Registry::Unlock();   // whatever the locker left queued

    EXPECT_EQ(mismatches, 0);
    EXPECT_EQ(gLive, before);
    std::vector<int> all;
    for (const auto& list : handles) {
        EXPECT_TRUE(std::is_sorted(list.begin(), list.end()));
        all.insert(all.end(), list.begin(), list.end());
    }
    std::sort(all.begin(), all.end());
    EXPECT_EQ(std::adjacent_find(all.begin(), all.end()), all.end());
}

}  // namespace
}  // namespace Glimmer

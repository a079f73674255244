#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <thread>

#include "foundation/Error.h"
#include "foundation/Mutex.h"
#include "support/LogCapture.h"

namespace Glimmer {
namespace {

using namespace std::chrono_literals;

// A second thread that takes the mutex once and lets go again; `acquired`
// tells whether it got through. A thread that got through while the mutex
// should have been held is a real fault; a slow thread only makes the
// "released" checks wait longer.
struct Contender {
    explicit Contender(Mutex& m)
        : thread([this, &m] {
              m.Lock();
              acquired = true;
              m.Unlock();
          }) {}
    ~Contender() {
        if (thread.joinable()) thread.join();
    }
    bool WaitAcquired() {
        for (int i = 0; i < 2000 && !acquired; ++i) std::this_thread::sleep_for(5ms);
        return acquired;
    }
    std::atomic<bool> acquired{false};
    std::thread thread;
};

TEST(Mutex, ReentrantForItsOwnerExclusiveForOthers) {
    Mutex m;
    ASSERT_TRUE(m.Construct());
    m.Lock();
    m.Lock();
    Contender other(m);
    std::this_thread::sleep_for(50ms);
    EXPECT_FALSE(other.acquired) << "taken while held twice";
    m.Unlock();  // one of two: still held
    std::this_thread::sleep_for(50ms);
    EXPECT_FALSE(other.acquired) << "taken while still held once";
    m.Unlock();
    EXPECT_TRUE(other.WaitAcquired());
}

TEST(Mutex, UnlockFromAnotherThreadDoesNothing) {
    Mutex m;
    ASSERT_TRUE(m.Construct());
    m.Lock();
    std::thread([&] { m.Unlock(); }).join();
    Contender other(m);
    std::this_thread::sleep_for(50ms);
    EXPECT_FALSE(other.acquired);
    m.Unlock();
    EXPECT_TRUE(other.WaitAcquired());
    // And an extra Unlock by the former owner does not release anyone else's hold.
    m.Unlock();
}

TEST(Mutex, ConstructOnceAndIgnoreUseBefore) {
    Mutex unconstructed;
    unconstructed.Lock();  // nothing to lock: returns at once
    unconstructed.Unlock();
    Testing::LogCapture capture;
    Mutex m;
    ASSERT_TRUE(m.Construct());
    Error::SetError(0);
    EXPECT_FALSE(m.Construct());
    EXPECT_EQ(Error::GetError(), 4);
    EXPECT_EQ(capture.Lines().size(), 1u);
    EXPECT_EQ(capture.Lines()[0].tag, "Gx_Mutex");

    // Destroyed while its owner still holds it.
    auto* held = new Mutex;
    ASSERT_TRUE(held->Construct());
    held->Lock();
    held->Lock();
    delete held;
}

}  // namespace
}  // namespace Glimmer

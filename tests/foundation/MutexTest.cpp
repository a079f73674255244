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

// A second thread that takes the mutex once and lets go. One that got through
// while the mutex should have been held is a real fault; a slow one only makes
// the final wait longer (no check depends on timing).
struct Contender {
    explicit Contender(Mutex& m)
        : thread([this, &m] {
              m.Lock();
              acquired = true;
              m.Unlock();
          }) {}
    ~Contender() { thread.join(); }
    std::atomic<bool> acquired{false};
    std::thread thread;
};

TEST(Mutex, ReentrantForItsOwnerAndDeafToOtherThreadsUnlocks) {
    Mutex m;
    ASSERT_TRUE(m.Construct());
    m.Lock();
    m.Lock();
    std::thread([&] { m.Unlock(); }).join();   // not the owner: nothing happens
    {
        Contender other(m);
        m.Unlock();   // one of two: still held
        std::this_thread::sleep_for(50ms);
        EXPECT_FALSE(other.acquired) << "taken while still held once";
        m.Unlock();
    }   // joins: the contender got it in the end

    Testing::LogCapture capture;
    EXPECT_EQ(Testing::CodeOf([&] { EXPECT_FALSE(m.Construct()); }), 4);
    EXPECT_EQ(capture.CountErrors("Gx_Mutex", 4), 1);
    Mutex unconstructed;
    unconstructed.Lock();   // nothing to lock: returns at once
    unconstructed.Unlock();
}

}  // namespace
}  // namespace Glimmer

#include "foundation/Mutex.h"

#include <pthread.h>
#include <unistd.h>

#include <atomic>
#include <new>

#include "foundation/Error.h"

namespace Glimmer {

namespace {
constexpr const char* kTag = "Gx_Mutex";

// Kernel thread id of the caller: never 0, so 0 can mean "no owner".
pid_t CurrentThread() {
    thread_local const pid_t id = gettid();
    return id;
}
}  // namespace

struct MutexImpl {
    pthread_mutex_t mutex;
    int32_t count = 0;  // nested Lock calls of the owner; only the owner touches it
    // Read without the lock by threads asking "is it me?": only the owner can
    // ever find its own id here, so a relaxed atomic is enough.
    std::atomic<pid_t> owner{0};
};

Mutex::Mutex() = default;

Mutex::~Mutex() {
    if (mImpl == nullptr) return;
    // Destroyed by its owner while held: let go first, a held mutex cannot be destroyed.
    if (mImpl->owner.load(std::memory_order_relaxed) == CurrentThread()) {
        mImpl->owner.store(0, std::memory_order_relaxed);
        mImpl->count = 0;
        pthread_mutex_unlock(&mImpl->mutex);
    }
    pthread_mutex_destroy(&mImpl->mutex);
    delete mImpl;
}

bool Mutex::Construct() {
    if (mImpl != nullptr) {
        GX_REPORT_ERROR(kTag, kErrorAlreadyConstructed);
        return false;
    }
    auto* impl = new (std::nothrow) MutexImpl;
    if (impl == nullptr || pthread_mutex_init(&impl->mutex, nullptr) != 0) {
        delete impl;
        GX_REPORT_ERROR(kTag, kErrorSystemCall);
        return false;
    }
    mImpl = impl;
    return true;
}

void Mutex::Lock() {
    if (mImpl == nullptr) return;
    const pid_t self = CurrentThread();
    if (mImpl->owner.load(std::memory_order_relaxed) == self) {
        ++mImpl->count;
        return;
    }
    pthread_mutex_lock(&mImpl->mutex);
    mImpl->owner.store(self, std::memory_order_relaxed);
    mImpl->count = 1;
}

void Mutex::Unlock() {
    if (mImpl == nullptr) return;
    if (mImpl->owner.load(std::memory_order_relaxed) != CurrentThread()) return;
    if (mImpl->count-- == 1) {
        mImpl->owner.store(0, std::memory_order_relaxed);
        pthread_mutex_unlock(&mImpl->mutex);
    }
}

}  // namespace Glimmer

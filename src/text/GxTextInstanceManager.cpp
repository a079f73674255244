#include "text/GxTextInstanceManager.h"

#include <algorithm>
#include <climits>
#include <list>
#include <map>
#include <new>

#include "foundation/Error.h"
#include "foundation/Mutex.h"
#include "platform/Log.h"

namespace Glimmer {
namespace {

constexpr const char* kTag = "GxTextInstanceManager";

struct Registry {
    std::map<int, GxTextObject*> handleToObject;
    std::map<GxTextObject*, int> bindCount;
    std::map<GxTextObject*, int> objectToHandle;
    std::list<GxTextObject*> pending;
    GxTextInstanceManager::ReleaseCallback releaseCallback = nullptr;
    bool locked = false;
    int lastHandle = 0;
};

// Made on first use, so that a text object built by another unit's static
// initialiser still finds it.
Registry& TheRegistry() {
    static Registry registry;
    return registry;
}

// Made by whichever member runs first (the static guard makes that safe);
// without one the members run unlocked.
Mutex* RegistryMutex() {
    static Mutex* mutex = [] {
        auto* made = new (std::nothrow) Mutex();
        if (made != nullptr && !made->Construct()) {
            delete made;
            made = nullptr;
        }
        return made;
    }();
    return mutex;
}

class Hold {
public:
    Hold() : mutex_(RegistryMutex()) {
        if (mutex_ != nullptr) mutex_->Lock();
    }
    ~Hold() {
        if (mutex_ != nullptr) mutex_->Unlock();
    }
    Hold(const Hold&) = delete;
    Hold& operator=(const Hold&) = delete;

private:
    Mutex* mutex_;
};

}  // namespace

void GxTextInstanceManager::SetCallBack(ReleaseCallback callback) {
    Hold hold;
    Registry& registry = TheRegistry();
    registry.releaseCallback = callback;
}

int GxTextInstanceManager::Register(GxTextObject* object) {
    Hold hold;
    Registry& registry = TheRegistry();
    if (object == nullptr) return -1;
    auto found = registry.objectToHandle.find(object);
    if (found != registry.objectToHandle.end()) return found->second;
    if (registry.lastHandle == INT_MAX) return -1;
    int handle = ++registry.lastHandle;
    registry.handleToObject[handle] = object;
    registry.objectToHandle[object] = handle;
    return handle;
}

void GxTextInstanceManager::Unregister(int handle) {
    Hold hold;
    Registry& registry = TheRegistry();
    auto found = registry.handleToObject.find(handle);
    if (found == registry.handleToObject.end()) return;
    registry.objectToHandle.erase(found->second);
    registry.handleToObject.erase(found);
}

void GxTextInstanceManager::Bind(GxTextObject* object) {
    Hold hold;
    Registry& registry = TheRegistry();
    auto found = registry.bindCount.find(object);
    if (found != registry.bindCount.end()) {
        ++found->second;
        Platform::LogPrint(Platform::kLogDebug, kTag, "Bind(%p) - count: %d", static_cast<void*>(object),
                           found->second);
        return;
    }
    // A deferred deletion of this object is cancelled.
    auto queued = std::find(registry.pending.begin(), registry.pending.end(), object);
    if (queued != registry.pending.end()) registry.pending.erase(queued);
    registry.bindCount[object] = 1;
    Platform::LogPrint(Platform::kLogDebug, kTag, "Bind(%p) - count: 1", static_cast<void*>(object));
}

bool GxTextInstanceManager::Release(GxTextObject* object, bool deleteOnLast) {
    Hold hold;
    Registry& registry = TheRegistry();
    auto found = registry.bindCount.find(object);
    if (found == registry.bindCount.end()) {
        GX_REPORT_ERROR(kTag, kErrorNotFound);
        return false;
    }
    int count = found->second--;
    if (count > 1 || !deleteOnLast) return true;
    // The callback deletes the object; the entry goes by key afterwards, in
    // case the object's destructor touched the map.
    if (registry.locked) {
        registry.pending.push_back(object);
    } else if (registry.releaseCallback != nullptr) {
        registry.releaseCallback(object);
    }
    registry.bindCount.erase(object);
    return true;
}

bool GxTextInstanceManager::Release(int handle) {
    Hold hold;
    Registry& registry = TheRegistry();
    auto found = registry.handleToObject.find(handle);
    if (found == registry.handleToObject.end()) {
        GX_REPORT_ERROR(kTag, kErrorNotFound);
        return false;
    }
    return Release(found->second, true);
}

GxTextObject* GxTextInstanceManager::FindGxTextObject(int handle) {
    Hold hold;
    Registry& registry = TheRegistry();
    auto found = registry.handleToObject.find(handle);
    if (found == registry.handleToObject.end()) {
        Platform::LogPrint(Platform::kLogDebug, kTag, "FindGxTextObject() - Can't find the handle[%d]",
                           handle);
        return nullptr;
    }
    return found->second;
}

int GxTextInstanceManager::FindGxTextHandle(GxTextObject* object) {
    Hold hold;
    Registry& registry = TheRegistry();
    auto found = registry.objectToHandle.find(object);
    return found != registry.objectToHandle.end() ? found->second : -1;
}

void GxTextInstanceManager::Lock() {
    Hold hold;
    Registry& registry = TheRegistry();
    registry.locked = true;
}

void GxTextInstanceManager::Unlock() {
    Hold hold;
    Registry& registry = TheRegistry();
    // Taken out first: a destructor run by the callback may bind or release.
    std::list<GxTextObject*> queued;
    queued.swap(registry.pending);
    if (registry.releaseCallback != nullptr) {
        for (GxTextObject* object : queued) registry.releaseCallback(object);
    }
    registry.locked = false;
}

}  // namespace Glimmer

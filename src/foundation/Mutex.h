#pragma once
// Mutex: a lock that its owning thread may take again. The count of nested
// Lock calls is kept beside the owner's thread id; the underlying pthread
// mutex is held from the first Lock to the matching last Unlock. Unlock from a
// thread that does not own it does nothing, and so do Lock and Unlock before
// Construct. Failures log "@ Native Error %ld : %d" under "Gx_Mutex".

namespace Glimmer {

struct MutexImpl;

class Mutex {
public:
    Mutex();
    virtual ~Mutex();
    Mutex(const Mutex&) = delete;
    Mutex& operator=(const Mutex&) = delete;

    bool Construct();   // code 4 when called twice, 1 when the system refuses
    void Lock();
    void Unlock();

private:
    MutexImpl* mImpl = nullptr;
};

}  // namespace Glimmer

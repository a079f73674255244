#pragma once
// GxTextInstanceManager: the process-wide registry of text objects.
//
// Every constructed text object gets an integer handle (1, 2, 3, ... in order
// of registration, never reused), which is all the Java side keeps. Objects
// are found by handle and handles by object. Bindings are counted apart from
// registration: the release of an object's last binding hands it to the
// release callback, which deletes it (its destructor then unregisters the
// handle). Between Lock and Unlock those deletions wait in a queue, where a
// new Bind rescues them; Unlock deletes the rest in queue order.
//
// Every member holds one re-entrant mutex for its whole run, across the
// callback too, so an object's destructor may call back in.

namespace Glimmer {

class GxTextObject;

class GxTextInstanceManager {
public:
    using ReleaseCallback = void (*)(GxTextObject*);

    static void SetCallBack(ReleaseCallback callback);

    // The object's handle, a new one the first time. -1 for null and once
    // every positive int has been handed out.
    static int Register(GxTextObject* object);
    // Forgets the handle and its object; unknown handles are ignored.
    static void Unregister(int handle);

    static void Bind(GxTextObject* object);
    // Error 9 and false for an object that was never bound.
    static bool Release(GxTextObject* object, bool deleteOnLast);
    static bool Release(int handle);

    static GxTextObject* FindGxTextObject(int handle);
    static int FindGxTextHandle(GxTextObject* object);

    static void Lock();
    static void Unlock();

private:
    GxTextInstanceManager() = delete;
};

}  // namespace Glimmer

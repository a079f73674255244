#pragma once
// File: a thin wrapper over a C stream, plus static path helpers that accept
// a GxString path (converted to UTF-8) or a byte-string path.
//
// Construct opens the file (code 4 when called twice, 7 for a null or empty
// GxString path or a null mode, 11 when fopen fails). Close and destruction
// flush, fsync a file opened with 'w' or 'a' in its mode, and close it, unless
// it was opened with keepOpen: then the stream stays open for whoever took it
// through GetFilePointer. After a Close the object may be constructed again.
// Calls without an open file fail with code 8 and return 0 (Read, Write),
// null (GetFilePointer) or -1. Failures log under "Gx_File".

#include <cstddef>
#include <cstdio>

namespace Glimmer {

class GxString;
struct FileImpl;

class File {
public:
    File();
    virtual ~File();
    File(const File&) = delete;
    File& operator=(const File&) = delete;

    bool Construct(const GxString* path, const char* mode, bool keepOpen);
    bool Construct(const char* path, const char* mode);

    size_t Read(void* buffer, size_t size, size_t count);
    size_t Write(const void* buffer, size_t size, size_t count);
    int Seek(long offset, int whence);
    long Tell();
    int Eof();
    int Error();
    FILE* GetFilePointer();
    int GetFileDescriptor();
    bool Close();

    // access(2), unlink(2), rename(2): 0 or -1. A GxString path whose UTF-8
    // size is below 1 (null or unconstructed) and a null byte path fail with
    // -1 and code 7.
    static int IsAccessible(const GxString* path, int mode);
    static int IsAccessible(const char* path, int mode);
    static int Unlink(const GxString* path);
    static int Unlink(const char* path);
    static int Rename(const GxString* oldPath, const GxString* newPath);
    static int Rename(const char* oldPath, const char* newPath);

private:
    FileImpl* mImpl = nullptr;
};

}  // namespace Glimmer

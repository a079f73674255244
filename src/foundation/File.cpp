#include "foundation/File.h"

#include <unistd.h>

#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <new>

#include "foundation/Error.h"
#include "foundation/GxString.h"
#include "platform/Log.h"

namespace Glimmer {

struct FileImpl {
    FILE* stream = nullptr;
    bool written = false;   // opened with 'w' or 'a': synced to disk on close
    bool keepOpen = false;  // the stream outlives this object
};

namespace {

constexpr const char* kTag = "Gx_File";

#define FILE_FAIL(code, value)         \
    do {                               \
        GX_REPORT_ERROR(kTag, (code)); \
        return value;                  \
    } while (0)

// A GxString path as UTF-8 in a heap buffer, freed on scope exit. `size` is
// the UTF-8 size including the terminator, or -1 for a null or unconstructed
// path (the buffer is then null).
struct Utf8Path {
    explicit Utf8Path(const GxString* path) {
        if (path == nullptr) return;
        size = path->GetUTF8Size();
        if (size < 1) return;
        bytes = static_cast<char*>(std::malloc(size_t(size)));
        if (bytes != nullptr && path->GetUTF8(bytes, size) < 0) {
            std::free(bytes);
            bytes = nullptr;
        }
    }
    ~Utf8Path() { std::free(bytes); }
    Utf8Path(const Utf8Path&) = delete;
    Utf8Path& operator=(const Utf8Path&) = delete;

    int size = -1;
    char* bytes = nullptr;
};

void CloseStream(FileImpl* impl) {
    if (impl->stream == nullptr || impl->keepOpen) return;
    std::fflush(impl->stream);
    if (impl->written) fsync(fileno(impl->stream));
    std::fclose(impl->stream);
    impl->stream = nullptr;
}

// Opens `path` into a new record; logs and reports on failure.
FileImpl* Open(const char* path, const char* mode, bool keepOpen, uint32_t* code, int* line) {
    FILE* stream = std::fopen(path, mode);
    if (stream == nullptr) {
        Platform::LogPrint(Platform::kLogError, kTag, "OpenFile - Fail to open file. errno = %d", errno);
        *code = kErrorFileOpen, *line = __LINE__;
        return nullptr;
    }
    auto* impl = new (std::nothrow) FileImpl;
    if (impl == nullptr) {
        std::fclose(stream);
        *code = kErrorSystemCall, *line = __LINE__;
        return nullptr;
    }
    impl->stream = stream;
    impl->written = std::strchr(mode, 'w') != nullptr || std::strchr(mode, 'a') != nullptr;
    impl->keepOpen = keepOpen;
    return impl;
}

}  // namespace

File::File() = default;

File::~File() {
    if (mImpl == nullptr) return;
    CloseStream(mImpl);
    delete mImpl;
}

bool File::Construct(const GxString* path, const char* mode, bool keepOpen) {
    if (mImpl != nullptr) FILE_FAIL(kErrorAlreadyConstructed, false);
    if (path == nullptr || mode == nullptr) FILE_FAIL(kErrorInvalidArgument, false);
    Utf8Path utf8(path);
    if (utf8.size < 1) {
        Platform::LogPrint(Platform::kLogError, kTag, "OpenFile() - pathSize < 0");
        FILE_FAIL(kErrorInvalidArgument, false);
    }
    if (utf8.bytes == nullptr) FILE_FAIL(kErrorInvalidArgument, false);
    uint32_t code = kErrorNone;
    int line = 0;
    mImpl = Open(utf8.bytes, mode, keepOpen, &code, &line);
    if (mImpl == nullptr) {
        ReportError(kTag, code, line);
        return false;
    }
    return true;
}

bool File::Construct(const char* path, const char* mode) {
    if (mImpl != nullptr) FILE_FAIL(kErrorAlreadyConstructed, false);
    if (path == nullptr || mode == nullptr) FILE_FAIL(kErrorInvalidArgument, false);
    uint32_t code = kErrorNone;
    int line = 0;
    mImpl = Open(path, mode, false, &code, &line);
    if (mImpl == nullptr) {
        ReportError(kTag, code, line);
        return false;
    }
    return true;
}

#define FILE_REQUIRE_OPEN(value) \
    if (mImpl == nullptr || mImpl->stream == nullptr) FILE_FAIL(kErrorNotConstructed, value)

size_t File::Read(void* buffer, size_t size, size_t count) {
    FILE_REQUIRE_OPEN(0);
    if (buffer == nullptr || (count != 0 && size > SIZE_MAX / count)) FILE_FAIL(kErrorInvalidArgument, 0);
    return std::fread(buffer, size, count, mImpl->stream);
}

size_t File::Write(const void* buffer, size_t size, size_t count) {
    FILE_REQUIRE_OPEN(0);
    if (buffer == nullptr || (count != 0 && size > SIZE_MAX / count)) FILE_FAIL(kErrorInvalidArgument, 0);
    return std::fwrite(buffer, size, count, mImpl->stream);
}

int File::Seek(long offset, int whence) {
    FILE_REQUIRE_OPEN(-1);
    return std::fseek(mImpl->stream, offset, whence);
}

long File::Tell() {
    FILE_REQUIRE_OPEN(-1);
    return std::ftell(mImpl->stream);
}

int File::Eof() {
    FILE_REQUIRE_OPEN(-1);
    return std::feof(mImpl->stream);
}

int File::Error() {
    FILE_REQUIRE_OPEN(-1);
    return std::ferror(mImpl->stream);
}

FILE* File::GetFilePointer() {
    FILE_REQUIRE_OPEN(nullptr);
    return mImpl->stream;
}

int File::GetFileDescriptor() {
    FILE_REQUIRE_OPEN(-1);
    return fileno(mImpl->stream);
}

bool File::Close() {
    FILE_REQUIRE_OPEN(false);
    // With keepOpen the stream is left to whoever took it; the object lets go.
    CloseStream(mImpl);
    delete mImpl;
    mImpl = nullptr;
    return true;
}

// ---- Path helpers ------------------------------------------------------------

int File::IsAccessible(const GxString* path, int mode) {
    Utf8Path utf8(path);
    if (utf8.size < 1) {
        Platform::LogPrint(Platform::kLogError, kTag, "IsAccessible() - pathSize < 0");
        FILE_FAIL(kErrorInvalidArgument, -1);
    }
    return IsAccessible(utf8.bytes, mode);
}

int File::IsAccessible(const char* path, int mode) {
    if (path == nullptr) FILE_FAIL(kErrorInvalidArgument, -1);
    return access(path, mode);
}

int File::Unlink(const GxString* path) {
    Utf8Path utf8(path);
    if (utf8.size < 1) {
        Platform::LogPrint(Platform::kLogError, kTag, "Unlink() - pathSize < 0");
        FILE_FAIL(kErrorInvalidArgument, -1);
    }
    return Unlink(utf8.bytes);
}

int File::Unlink(const char* path) {
    if (path == nullptr) FILE_FAIL(kErrorInvalidArgument, -1);
    return unlink(path);
}

int File::Rename(const GxString* oldPath, const GxString* newPath) {
    Utf8Path oldUtf8(oldPath);
    Utf8Path newUtf8(newPath);
    if (oldUtf8.size < 1 || newUtf8.size < 1) {
        Platform::LogPrint(Platform::kLogError, kTag, "Rename() - pathSize < 0 : old %d, new %d",
                           oldUtf8.size, newUtf8.size);
        FILE_FAIL(kErrorInvalidArgument, -1);
    }
    return Rename(oldUtf8.bytes, newUtf8.bytes);
}

int File::Rename(const char* oldPath, const char* newPath) {
    if (oldPath == nullptr || newPath == nullptr) FILE_FAIL(kErrorInvalidArgument, -1);
    return std::rename(oldPath, newPath);
}

}  // namespace Glimmer

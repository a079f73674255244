// Assets on Linux: plain files under one folder.

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <new>

#include "platform/Assets.h"

namespace Glimmer::Platform {
namespace {

class FileAsset final : public Asset {
public:
    FileAsset(int fd, int64_t length) : fd_(fd), length_(length) {}
    ~FileAsset() override { ::close(fd_); }
    int64_t GetLength() const override { return length_; }
    int64_t Read(void* buffer, size_t count) override {
        if (buffer == nullptr) return -1;
        ssize_t n;
        do {
            n = ::read(fd_, buffer, count);
        } while (n < 0 && errno == EINTR);
        return int64_t(n);
    }

private:
    int fd_;
    int64_t length_;
};

// A relative path that cannot climb out of the root.
bool InsideRoot(const std::string& name) {
    if (name.empty() || name[0] == '/') return false;
    size_t pos = 0;
    while (pos <= name.size()) {
        size_t slash = name.find('/', pos);
        if (slash == std::string::npos) slash = name.size();
        if (name.compare(pos, slash - pos, "..") == 0 && slash - pos == 2) return false;
        pos = slash + 1;
    }
    return true;
}

}  // namespace

std::unique_ptr<Asset> AssetManager::Open(const char* name) const {
    if (name == nullptr || !InsideRoot(name)) return nullptr;
    std::string path = root_.empty() ? std::string(name) : root_ + "/" + name;
    // Without blocking: opening a pipe would wait for a writer before the
    // check below could refuse it.
    int fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    if (fd < 0) return nullptr;
    struct stat info;
    if (::fstat(fd, &info) != 0 || !S_ISREG(info.st_mode)) {
        ::close(fd);
        return nullptr;
    }
    std::unique_ptr<Asset> asset(new (std::nothrow) FileAsset(fd, int64_t(info.st_size)));
    if (asset == nullptr) ::close(fd);
    return asset;
}

}  // namespace Glimmer::Platform

#include "api/FileBytes.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

namespace glimmer::detail {
namespace {

std::string Quoted(const std::string& path) { return "'" + path + "'"; }

std::string CannotRead(const std::string& path, int error) {
    return "cannot read " + Quoted(path) + ": " + std::strerror(error);
}

}  // namespace

FileBytes ReadFileBytes(const std::string& path, std::size_t maxBytes) {
    FileBytes out;
    const int fd = ::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC | O_NOCTTY);
    if (fd < 0) {
        out.error = CannotRead(path, errno);
        return out;
    }
    struct stat info {};
    if (::fstat(fd, &info) != 0) {
        out.error = CannotRead(path, errno);
    } else if (!S_ISREG(info.st_mode)) {
        out.error = "cannot read " + Quoted(path) + ": not a regular file";
    } else if (info.st_size < 0 || std::size_t(info.st_size) > maxBytes) {
        out.error = "cannot read " + Quoted(path) + ": larger than " + std::to_string(maxBytes) + " bytes";
    } else {
        // The size may change while we read: read what is there, up to the limit.
        out.bytes.resize(std::size_t(info.st_size));
        std::size_t done = 0;
        while (out.error.empty()) {
            if (done == out.bytes.size()) {
                if (done == maxBytes) break;
                out.bytes.resize(std::min(maxBytes, done + 65536));
            }
            const ssize_t n = ::read(fd, out.bytes.data() + done, out.bytes.size() - done);
            if (n < 0 && errno == EINTR) continue;
            if (n < 0) out.error = CannotRead(path, errno);
            if (n <= 0) break;
            done += std::size_t(n);
        }
        out.bytes.resize(done);
    }
    ::close(fd);
    if (!out.error.empty()) out.bytes.clear();
    return out;
}

}  // namespace glimmer::detail

#pragma once
// Reading a whole file for the public API: the only place the API opens files.
//
// The file must be a regular file no larger than `maxBytes`. It is opened
// without blocking, so a FIFO or a device named by mistake is refused at once
// instead of hanging the caller (and, through the core lock, every other
// thread) on a read that never ends.

#include <cstddef>
#include <string>
#include <vector>

namespace glimmer::detail {

struct FileBytes {
    std::vector<char> bytes;
    std::string error;   // empty on success: "cannot read 'x': No such file or directory"
};

FileBytes ReadFileBytes(const std::string& path, std::size_t maxBytes);

}  // namespace glimmer::detail

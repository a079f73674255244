#pragma once
// Application assets: files shipped with the application and read by name.
// On a device the asset manager of the package; on Linux a folder.

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>

namespace Glimmer::Platform {

class Asset {
public:
    virtual ~Asset() = default;   // closes it
    virtual int64_t GetLength() const = 0;
    // Reads up to `count` bytes at the current position; the number read, or -1.
    virtual int64_t Read(void* buffer, size_t count) = 0;
};

class AssetManager {
public:
    // Assets are the files under `root`.
    explicit AssetManager(std::string root) : root_(std::move(root)) {}

    // Null when there is no such asset. Names are relative paths inside the
    // root; absolute names and names with a ".." part are never found.
    std::unique_ptr<Asset> Open(const char* name) const;

private:
    std::string root_;
};

}  // namespace Glimmer::Platform

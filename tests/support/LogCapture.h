#pragma once
// Collects the library's log lines while alive, so tests can assert on them.

#include <mutex>
#include <string>
#include <vector>

#include "platform/Log.h"

namespace Glimmer::Testing {

struct LogLine {
    int priority;
    std::string tag;
    std::string message;
};

class LogCapture {
public:
    LogCapture() { Platform::SetLogCapture(&LogCapture::Receive, this); }
    ~LogCapture() { Platform::SetLogCapture(nullptr, nullptr); }
    LogCapture(const LogCapture&) = delete;
    LogCapture& operator=(const LogCapture&) = delete;

    std::vector<LogLine> Lines() const {
        std::lock_guard<std::mutex> lock(mutex_);
        return lines_;
    }
    // Lines under `tag` whose message equals `message`.
    int Count(const std::string& tag, const std::string& message) const {
        int n = 0;
        for (const LogLine& line : Lines()) n += (line.tag == tag && line.message == message);
        return n;
    }
    void Clear() {
        std::lock_guard<std::mutex> lock(mutex_);
        lines_.clear();
    }

private:
    static void Receive(int priority, const char* tag, const char* message, void* self) {
        auto* capture = static_cast<LogCapture*>(self);
        std::lock_guard<std::mutex> lock(capture->mutex_);
        capture->lines_.push_back({priority, tag, message});
    }

    mutable std::mutex mutex_;
    std::vector<LogLine> lines_;
};

}  // namespace Glimmer::Testing

#pragma once
// Collects the library's log lines while alive, so tests can assert on them.

#include <mutex>
#include <string>
#include <vector>

#include "foundation/Error.h"
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
        return CountIf([&](const LogLine& line) { return line.tag == tag && line.message == message; });
    }
    // Error reports ("@ Native Error <code> : ...") at error priority under `tag`.
    int CountErrors(const std::string& tag, int code) const {
        const std::string prefix = "@ Native Error " + std::to_string(code) + " : ";
        return CountIf([&](const LogLine& l) { return l.tag == tag && l.priority == 6 && l.message.rfind(prefix, 0) == 0; });
    }
    void Clear() {
        std::lock_guard<std::mutex> lock(mutex_);
        lines_.clear();
    }

private:
    template <typename Pred>
    int CountIf(Pred pred) const {
        int n = 0;
        for (const LogLine& line : Lines()) n += pred(line);
        return n;
    }
    static void Receive(int priority, const char* tag, const char* message, void* self) {
        auto* capture = static_cast<LogCapture*>(self);
        std::lock_guard<std::mutex> lock(capture->mutex_);
        capture->lines_.push_back({priority, tag, message});
    }

    mutable std::mutex mutex_;
    std::vector<LogLine> lines_;
};

// Runs `op` on a cleared error slot; the code it left (0 when none).
template <typename Op>
int CodeOf(Op op) {
    Error::SetError(0);
    op();
    return Error::GetError();
}

}  // namespace Glimmer::Testing

#include "platform/Log.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <mutex>

namespace Glimmer::Platform {
namespace {

std::mutex gCaptureMutex;
LogCapture gCapture = nullptr;
void* gCaptureContext = nullptr;

// Lowest priority printed to stderr; above every priority (silent) by default.
int StderrThreshold() {
    static const int threshold = [] {
        const char* level = std::getenv("GLIMMER_LOG_LEVEL");
        if (level == nullptr) return kLogError + 1;
        if (std::strcmp(level, "debug") == 0) return int(kLogDebug);
        if (std::strcmp(level, "info") == 0) return int(kLogInfo);
        if (std::strcmp(level, "warn") == 0) return int(kLogWarn);
        if (std::strcmp(level, "error") == 0) return int(kLogError);
        return kLogError + 1;
    }();
    return threshold;
}

char PriorityLetter(int priority) {
    switch (priority) {
        case kLogDebug: return 'D';
        case kLogInfo: return 'I';
        case kLogWarn: return 'W';
        case kLogError: return 'E';
        default: return '?';
    }
}

}  // namespace

void LogPrintV(int priority, const char* tag, const char* format, va_list args) {
    if (format == nullptr) return;
    char message[1024];
    std::vsnprintf(message, sizeof message, format, args);
    if (tag == nullptr) tag = "";
    {
        std::lock_guard<std::mutex> lock(gCaptureMutex);
        if (gCapture != nullptr) gCapture(priority, tag, message, gCaptureContext);
    }
    if (priority >= StderrThreshold()) {
        std::fprintf(stderr, "%c/%s: %s\n", PriorityLetter(priority), tag, message);
    }
}

void LogPrint(int priority, const char* tag, const char* format, ...) {
    va_list args;
    va_start(args, format);
    LogPrintV(priority, tag, format, args);
    va_end(args);
}

void SetLogCapture(LogCapture capture, void* context) {
    std::lock_guard<std::mutex> lock(gCaptureMutex);
    gCapture = capture;
    gCaptureContext = context;
}

}  // namespace Glimmer::Platform

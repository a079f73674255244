#include "foundation/GxLog.h"

#include <atomic>
#include <cstdarg>
#include <cstdio>
#include <cstring>

#include "foundation/GxString.h"
#include "platform/Log.h"

namespace Glimmer {

namespace {

constexpr const char* kTag = "gxeffect";
constexpr size_t kFileBufferSize = 256;
constexpr size_t kMessageBufferSize = 1024;
constexpr int kConvertBufferSize = 512;

std::atomic<uint8_t> mCurrentLogLevel{255};
std::atomic<bool> isBuildTypeEngMode{true};
std::atomic<bool> isCheckedBuildType{false};
std::atomic<bool> DEBUG_ENABLE{false};

// Android priority for levels 1..8 (index level - 1); the single-bit levels
// map to debug, info, warning and error, the mixed ones to info.
constexpr int kPriorityForLevel[8] = {3, 4, 4, 5, 4, 4, 4, 6};

int PriorityFor(int level) {
    return (level >= 1 && level <= 8) ? kPriorityForLevel[level - 1] : Platform::kLogInfo;
}

void PrintLogV(int level, const char* file, const char* format, va_list args) {
    if ((mCurrentLogLevel.load(std::memory_order_relaxed) & level) == 0 || format == nullptr) return;
    if (file == nullptr) return;
    const size_t fileLength = std::strlen(file);
    if (fileLength >= kFileBufferSize) return;
    char stem[kFileBufferSize];
    std::memcpy(stem, file, fileLength + 1);
    if (char* dot = std::strrchr(stem, '.')) *dot = 0;

    char message[kMessageBufferSize];
    std::vsnprintf(message, sizeof message, format, args);
    Platform::LogPrint(PriorityFor(level), kTag, "[%s] %s \n", stem, message);
}

// Milliseconds as the timing lines show them, in single precision.
float Milliseconds(int64_t microseconds) { return float(microseconds) / 1000.0f; }

}  // namespace

void GxLog::printLog(int level, const char* file, const char* format, ...) {
    va_list args;
    va_start(args, format);
    PrintLogV(level, file, format, args);
    va_end(args);
}

void GxLog::printTime(const char* file, const char* name, int64_t microseconds) {
    if ((mCurrentLogLevel.load(std::memory_order_relaxed) & GX_LOG_TIME) == 0) return;
    printLog(GX_LOG_INFO, file, "[Time] %s %.3fms", name != nullptr ? name : "(null)",
             double(Milliseconds(microseconds)));
}

void GxLog::printTime(const char* file, const char* name, int64_t microseconds,
                      const char* format, ...) {
    if ((mCurrentLogLevel.load(std::memory_order_relaxed) & GX_LOG_TIME) == 0) return;
    char suffix[kMessageBufferSize] = "";
    if (format != nullptr) {
        va_list args;
        va_start(args, format);
        std::vsnprintf(suffix, sizeof suffix, format, args);
        va_end(args);
    }
    printLog(GX_LOG_INFO, file, "[Time] %s %.3fms %s", name != nullptr ? name : "(null)",
             double(Milliseconds(microseconds)), suffix);
}

void GxLog::setPrintLogLevel(uint8_t mask) { mCurrentLogLevel.store(mask, std::memory_order_relaxed); }

uint8_t GxLog::getPrintLogLevel() { return mCurrentLogLevel.load(std::memory_order_relaxed); }

const char* GxLog::ConvertLog(const GxString* text) {
    // One buffer per thread rather than one per process: the returned text is
    // only ever read right away by the same thread, and two threads logging at
    // once can no longer overwrite each other's line.
    thread_local char buffer[kConvertBufferSize];
    if (text == nullptr) return "[### null ###]";
    const int size = text->GetUTF8Size();
    if (size < 1) return "[### null ###]";
    if (size > kConvertBufferSize) return "[### string is too long ###]";
    text->GetUTF8(buffer, kConvertBufferSize);  // on failure: the text before the bad character
    return buffer;
}

void GxLog::SetBuildType(bool engMode) {
    bool unchecked = false;
    if (isCheckedBuildType.compare_exchange_strong(unchecked, true)) {
        isBuildTypeEngMode.store(engMode, std::memory_order_relaxed);
    }
}

bool GxLog::IsCheckedBuildType() { return isCheckedBuildType.load(std::memory_order_relaxed); }

bool GxLog::IsBuildTypeEngMode() { return isBuildTypeEngMode.load(std::memory_order_relaxed); }

bool GxLog::IsAllLogEnable() {
    return DEBUG_ENABLE.load(std::memory_order_relaxed) &&
           isBuildTypeEngMode.load(std::memory_order_relaxed);
}

void GxLog::SetDebugEnable(bool enable) { DEBUG_ENABLE.store(enable, std::memory_order_relaxed); }

}  // namespace Glimmer

#pragma once
// GxLog: the library's own leveled log, written under the tag "gxeffect" as
// "[<source file stem>] <message> ". A process-wide bit mask chooses the levels
// that print; the build type, set once from Java, decides whether the
// verbose diagnostic lines (IsAllLogEnable) are written at all.
//
// The flags are process-wide single bytes without a lock; they are atomics
// only so that concurrent reads and writes stay defined.

#include <cstdint>

namespace Glimmer {

class GxString;

enum GxLogLevel : int {
    GX_LOG_DEBUG = 1,
    GX_LOG_INFO = 2,
    GX_LOG_WARN = 4,
    GX_LOG_ERROR = 8,
    GX_LOG_TIME = 16,   // timing lines; they print through GX_LOG_INFO
};

class GxLog {
public:
    // Prints when the level is enabled in the mask and the format is not null.
    // `file` is a source path: its text up to the last '.' names the line. A
    // null path, or one of 256 characters or more, prints nothing. The message
    // is cut to 1,023 bytes.
    static void printLog(int level, const char* file, const char* format, ...)
        __attribute__((format(printf, 3, 4)));

    // "[Time] <name> <ms>ms" at GX_LOG_INFO, when GX_LOG_TIME is enabled.
    static void printTime(const char* file, const char* name, int64_t microseconds);
    // The same with a formatted suffix: "[Time] <name> <ms>ms <suffix>".
    static void printTime(const char* file, const char* name, int64_t microseconds,
                          const char* format, ...) __attribute__((format(printf, 4, 5)));

    static void setPrintLogLevel(uint8_t mask);
    static uint8_t getPrintLogLevel();

    // The string's UTF-8 in a 512-byte buffer, "[### null ###]" for a null (or
    // unconstructed) string, "[### string is too long ###]" when its UTF-8 size
    // is above 512. The buffer belongs to the calling thread and is overwritten
    // by its next call.
    static const char* ConvertLog(const GxString* text);

    // Only the first call counts.
    static void SetBuildType(bool engMode);
    static bool IsCheckedBuildType();
    static bool IsBuildTypeEngMode();
    // DEBUG_ENABLE and eng mode together.
    static bool IsAllLogEnable();
    static void SetDebugEnable(bool enable);
};

}  // namespace Glimmer

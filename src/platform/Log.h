#pragma once
// The one place the library writes to the system log. On a device this is the
// Android log; on Linux a stderr sink, filtered by GLIMMER_LOG_LEVEL
// (debug, info, warn, error; silent when unset), with a capture hook for tests.

#include <cstdarg>

namespace Glimmer::Platform {

// Android log priorities, the numbers the library's log lines are written at.
enum LogPriority : int {
    kLogDebug = 3,
    kLogInfo = 4,
    kLogWarn = 5,
    kLogError = 6,
};

void LogPrint(int priority, const char* tag, const char* format, ...)
    __attribute__((format(printf, 3, 4)));
void LogPrintV(int priority, const char* tag, const char* format, va_list args);

// Receives every line, whatever the stderr level, until reset with nullptr.
using LogCapture = void (*)(int priority, const char* tag, const char* message, void* context);
void SetLogCapture(LogCapture capture, void* context);

}  // namespace Glimmer::Platform

#pragma once
// The library's single failure convention: a failing operation logs
// "@ Native Error %ld : %d" (code, source line) at error priority under its
// class's tag, stores the code in the calling thread's error slot and returns
// false, null, 0 or -1. Java reads the code back through Error_GetError.
//
// Beside the code each thread keeps a reason: one sentence for people on why
// its last described failure happened. Reporting a code sets the phrase of
// that code; failures that set no code (a font file that cannot be read,
// font bytes that are no font) describe themselves. Reasons change no result
// and no log line; Java reads them through GxError.getLastReason.

#include <cstdint>

namespace Glimmer {

enum ErrorCode : uint32_t {
    kErrorNone = 0,
    kErrorSystemCall = 1,        // a system call failed (mutex initialisation)
    kErrorLimitReached = 2,      // a fixed limit was reached (list traversals)
    kErrorIndexOutOfRange = 3,
    kErrorAlreadyConstructed = 4,
    kErrorInvalidArgument = 7,   // null pointer, negative or zero size
    kErrorNotConstructed = 8,    // or a required member missing
    kErrorNotFound = 9,          // handle or object not found
    kErrorFileOpen = 11,
    kErrorNotBound = 19,         // no native object bound to the Java object
};

class Error {
public:
    static void SetError(uint32_t code);
    static int GetError();

    // printf-style; cut at kMaxReasonBytes - 1 bytes.
    static void SetReason(const char* format, ...) __attribute__((format(printf, 1, 2)));
    // The calling thread's reason; "" when none was set (or it was cleared).
    static const char* GetReason();
    static void ClearReason();

    static constexpr int kMaxReasonBytes = 1024;
};

// The phrase that reporting `code` leaves as the reason.
const char* ReasonOfCode(uint32_t code);

// Logs the failure line under `tag`, then stores `code` for this thread.
void ReportError(const char* tag, uint32_t code, int line);

}  // namespace Glimmer

#define GX_REPORT_ERROR(tag, code) ::Glimmer::ReportError((tag), (code), __LINE__)

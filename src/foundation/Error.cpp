#include "foundation/Error.h"

#include <cstdarg>
#include <cstdio>

#include "platform/Log.h"

namespace Glimmer {

namespace {
thread_local uint32_t tErrorSlot = kErrorNone;
// A plain array: no allocation and nothing to destroy when a thread ends.
thread_local char tReason[Error::kMaxReasonBytes];
}

void Error::SetError(uint32_t code) { tErrorSlot = code; }

int Error::GetError() { return int(tErrorSlot); }

void Error::SetReason(const char* format, ...) {
    va_list args;
    va_start(args, format);
    if (std::vsnprintf(tReason, sizeof tReason, format, args) < 0) tReason[0] = '\0';
    va_end(args);
}

const char* Error::GetReason() { return tReason; }

void Error::ClearReason() { tReason[0] = '\0'; }

const char* ReasonOfCode(uint32_t code) {
    switch (code) {
        case kErrorNone: return "no error";
        case kErrorSystemCall: return "a system call failed";
        case kErrorLimitReached: return "a size or count limit of the library was reached";
        case kErrorIndexOutOfRange: return "an index lies outside its range";
        case kErrorAlreadyConstructed: return "the object was set up already";
        case kErrorInvalidArgument: return "an argument is invalid (null, negative, zero or malformed)";
        case kErrorNotConstructed: return "the object is not set up, or lacks what the call needs";
        case kErrorNotFound: return "no such object";
        case kErrorFileOpen: return "a file could not be opened";
        case kErrorNotBound: return "no native text behind the Java object: it was released, or could not be made";
        default: return "an unknown error";
    }
}

void ReportError(const char* tag, uint32_t code, int line) {
    Platform::LogPrint(Platform::kLogError, tag, "@ Native Error %ld : %d", long(code), line);
    Error::SetError(code);
    Error::SetReason("error %u: %s", unsigned(code), ReasonOfCode(code));
}

}  // namespace Glimmer

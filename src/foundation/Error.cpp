#include "foundation/Error.h"

#include "platform/Log.h"

namespace Glimmer {

namespace {
thread_local uint32_t tErrorSlot = kErrorNone;
}

void Error::SetError(uint32_t code) { tErrorSlot = code; }

int Error::GetError() { return int(tErrorSlot); }

void ReportError(const char* tag, uint32_t code, int line) {
    Platform::LogPrint(Platform::kLogError, tag, "@ Native Error %ld : %d", long(code), line);
    Error::SetError(code);
}

}  // namespace Glimmer

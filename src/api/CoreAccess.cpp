#include "api/CoreAccess.h"

#include "font/SystemFontFamilies.h"

namespace glimmer::detail {

std::unique_lock<std::mutex> LockCore() {
    static std::mutex mutex;
    return std::unique_lock<std::mutex>(mutex);
}

void EnsureSystemFonts() {
    static bool installed = false;
    if (installed) return;
    Glimmer::InstallSystemFontFamilies();
    installed = true;
}

}  // namespace glimmer::detail

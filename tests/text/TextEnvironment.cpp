// The system's font families are set once per process, before any test.

#include <gtest/gtest.h>

#include "font/SystemFontFamilies.h"

namespace {

class SystemFonts : public ::testing::Environment {
public:
    void SetUp() override { ASSERT_TRUE(Glimmer::InstallSystemFontFamilies()); }
};

[[maybe_unused]] ::testing::Environment* const gSystemFonts =
    ::testing::AddGlobalTestEnvironment(new SystemFonts);

}  // namespace

// fontconfig 2.14 loses a few hundred bytes while parsing its XML
// configuration (once per process, inside FcInit); without frame pointers in
// the library the leak's stack stops at it, so it is matched by library.
extern "C" const char* __lsan_default_suppressions() { return "leak:libfontconfig.so\n"; }

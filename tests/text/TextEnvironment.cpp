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

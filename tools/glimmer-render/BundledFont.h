#pragma once
// The font the renderer uses when none is given: DejaVu Sans Bold (licence in
// fonts/LICENSE), linked into the program so that it runs from anywhere.

#include <string_view>

namespace Glimmer::RenderTool {

// The name the font is known by; its "-Bold" gives the weight 700.
inline constexpr const char* kBundledFontName = "DejaVuSans-Bold.ttf";

std::string_view BundledFont();

}  // namespace Glimmer::RenderTool

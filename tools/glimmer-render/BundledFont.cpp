#include "BundledFont.h"

extern "C" const char glimmer_render_font_begin[];
extern "C" const char glimmer_render_font_end[];

namespace Glimmer::RenderTool {

std::string_view BundledFont() {
    return std::string_view(glimmer_render_font_begin,
                            size_t(glimmer_render_font_end - glimmer_render_font_begin));
}

}  // namespace Glimmer::RenderTool

#pragma once
// What a public Font handle stands for: a font loaded into the core's font
// store under a key, with the vertical metrics line layout needs.

#include <memory>
#include <string>

#include "glimmer/glimmer.h"
#include "platform/FontMetrics.h"

namespace glimmer::detail {

// Vertical metrics of a font at a text size in whole pixels, y down: the top
// and bottom of the font's box, and its ascent and descent lines.
struct FontExtent {
    int top = 0;       // negative
    int ascent = 0;    // negative
    int descent = 0;
    int bottom = 0;
};

struct FontData {
    std::string key;          // the core's name for the font: a path, or a name for bytes
    Glimmer::Platform::FontMetrics metrics;  // font units, y up

    FontExtent ExtentAt(float textSize) const;
};

struct FontAccess {
    static const FontData* Data(const Font& font) { return font.data_.get(); }
    static Font Make(std::shared_ptr<const FontData> data) {
        Font font;
        font.data_ = std::move(data);
        return font;
    }
};

}  // namespace glimmer::detail

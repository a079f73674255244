#pragma once
// The contact sheet: every effect kind, and a few combinations, rendered by
// the library on a sample text, each cell labelled with the effect it shows
// (the labels are rendered by the library too).

#include <string>
#include <vector>

#include "Png.h"

namespace Glimmer::RenderTool {

struct GalleryCell {
    std::string label;                 // shown under the sample
    std::vector<std::string> effects;  // in command-line form
};

// The cells of the sheet, in reading order.
const std::vector<GalleryCell>& GalleryCells();

// Renders the sheet. `sampleText` and `fontPath` may be empty for the
// defaults ("Glimmer" in the bundled font). The pattern tile is drawn here.
Image RenderGallery(const std::string& sampleText, const std::string& fontPath);

}  // namespace Glimmer::RenderTool

// Labelled pictures in rows, as one picture: the contact sheet of an effect's presets.
#pragma once

#include <string>
#include <vector>

#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::hosts {

struct GridCell {
    std::string label;  // UTF-8
    BgraPicture picture;
};

struct GridOptions {
    std::string title;  // above the rows; may be empty
    int columns = 4;
    std::int32_t cellWidth;  // pixels; pictures are scaled to it
};

// All pictures have the shape of the first. Alpha is not shown; the result is opaque. Throws UsageError when it would
// be too large to draw.
BgraPicture DrawGrid(const std::vector<GridCell>& cells, const GridOptions& options);

}  // namespace velmora::hosts

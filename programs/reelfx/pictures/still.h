// Still pictures for the user: labelled ones in rows, drawn as one picture, and written to a file.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::hosts {

// The contact sheet of an effect's presets, frames side by side (picture_grid.cpp).

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

// PNG or JPEG, according to the file name's extension (still_writer.cpp).

// Throws UsageError for any other extension. Called before the work begins.
void CheckStillName(const std::string& path);

// Throws Failure (kExitOutput) when the file exists and may not be overwritten or cannot be written. Alpha is
// dropped.
void WriteStill(const BgraPicture& picture, const std::string& path, bool mayOverwrite);

}  // namespace velmora::hosts

// Pictures that reelfx makes beside the film: sheets of labelled pictures, files of single ones, and mattes.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "programs/reelfx/common/effect_choice.h"
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

// A matte is the damage of the effects as a separate picture, for compositing in other programs: wear, spots and scratches
// on a transparent background, with straight alpha (colours not multiplied by it), as editors and their file formats
// expect. Laid over the picture, it gives the damaged picture (matte.cpp).
//
// Each kind of damage turns a channel's value v into nearly a + b v, with the same a and b for all three
// channels. So the effect is drawn on a flat picture whose channels have three different levels; the results
// give the opacity and grey of every pixel.

// Effects without damage leave a matte alone. Throws UsageError when no effect makes damage, or one makes damage that
// a matte with one opacity for all channels cannot show.
void CheckMatte(const std::vector<EffectChoice>& choices);

// The picture on which the effect draws its damage.
void FillMatteGround(BgraPicture& picture);

// Turns the damaged picture into the matte, in place.
void ReadMatte(BgraPicture& picture);

}  // namespace velmora::hosts

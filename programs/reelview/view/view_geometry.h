// Where the picture lies in its window: zoom, before and after, the divider.
#pragma once

#include <cstdint>

#include "text/number_text.h"
#include "programs/reelview/base/picture.h"

namespace velmora::reelview {

enum class Zoom { kFit, kFull, kDouble };
enum class Compare { kAfter, kDivider, kSideBySide };

struct ViewState {
    Zoom zoom = Zoom::kFit;
    Compare compare = Compare::kDivider;
    double divider = 0.5;             // fraction of the picture's width that shows "before"
    std::int32_t panX = 0, panY = 0;  // offset of an enlarged picture in pixels
};

struct ViewPlaces {
    Box before, after;                          // rectangles of the whole picture; equal unless side by side
    std::int32_t divider = 0;                   // x of the line; kDivider only
    std::int32_t panRangeX = 0, panRangeY = 0;  // how far the picture can be moved either way
};

// All in window pixels. `scale` is the window's dots per inch over 96. At 100 % one picture pixel is one screen
// pixel, whatever the scale; the gap between two pictures grows with it.
[[nodiscard]] ViewPlaces PlacePicture(const ViewState& state, hosts::FrameSize picture, std::int32_t width,
                                      std::int32_t height, double scale);

// The divider's position, as a fraction, for a mouse at `x`.
[[nodiscard]] double DividerAt(const ViewPlaces& places, std::int32_t x);

}  // namespace velmora::reelview

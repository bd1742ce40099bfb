// Cameras held in another position store the picture as it comes from the sensor, with a tag that says how players
// must rotate or mirror it. Effects are applied to the picture as it is seen: scratches run from top to bottom for
// the viewer.
#pragma once

#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::hosts {

// A point moves by a step of (xx, yx) for a step to the right, and of (xy, yy) for a step down; each is -1, 0 or 1.
struct PictureTurn {
    int xx = 1, xy = 0;
    int yx = 0, yy = 1;

    bool operator==(const PictureTurn&) const = default;
    [[nodiscard]] bool IsNone() const { return *this == PictureTurn{}; }
    [[nodiscard]] bool SwapsSides() const { return xx == 0; }
    [[nodiscard]] PictureTurn Back() const { return {xx, yx, xy, yy}; }
    // "rotated by 90 degrees", "mirrored", "mirrored and rotated by 90 degrees"; clockwise.
    [[nodiscard]] std::string Words() const;
    [[nodiscard]] int Degrees() const;  // clockwise, after mirroring left and right if it is mirrored
    [[nodiscard]] bool IsMirrored() const { return xx * yy - xy * yx < 0; }
};

// How players turn the stream's picture. A tag on the frame, as in photographs, takes precedence.
PictureTurn TurnOf(const AVStream& stream, const AVFrame& first);

void TurnPicture(const BgraPicture& from, const PictureTurn& turn, BgraPicture& to);

}  // namespace velmora::hosts

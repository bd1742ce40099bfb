// Cameras held in another position store the picture as it comes from the sensor, with a tag that says how
// players must rotate it. Effects are applied to the picture as it is seen: scratches run from top to bottom
// for the viewer.
#pragma once

#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::hosts {

// The number of clockwise quarter turns, 0 to 3, by which players rotate the stream's picture.
int QuarterTurnsOf(const AVStream& stream);

// Rotates `from` clockwise into `to`.
void TurnPicture(const BgraPicture& from, int quarterTurns, BgraPicture& to);

}  // namespace velmora::hosts

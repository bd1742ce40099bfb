// Cameras that are held upright or upside down store lying pictures and say how players have to turn them.
// Effects work on the picture as it is seen: scratches run from top to bottom for the viewer.
#pragma once

#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::hosts {

// By how many quarters of a turn, clockwise, players show the stream's picture turned: 0 to 3.
int QuarterTurnsOf(const AVStream& stream);

// `to` becomes `from` turned clockwise.
void TurnPicture(const BgraPicture& from, int quarterTurns, BgraPicture& to);

}  // namespace velmora::hosts

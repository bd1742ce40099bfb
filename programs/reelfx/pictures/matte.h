// The damage of an effect as a picture of its own, for compositing in other programs: wear, spots and
// scratches on transparent, with straight alpha (colours not multiplied by it), as editors and their file
// formats expect it. Laid over the picture it gives the damaged picture.
//
// Each kind of damage makes of a channel's value v a value that is nearly a + b v, the same for all three
// channels. So the effect draws on a flat picture whose channels are three levels, and from what becomes of
// them follow opacity and grey of every pixel.
#pragma once

#include "programs/reelfx/media/bgra_picture.h"
#include "programs/reelfx/common/effect_choice.h"

namespace velmora::hosts {

// Throws UsageError when the effect makes no damage, or one that a matte with one opacity for all channels
// cannot hold.
void CheckMatte(const EffectChoice& choice);

// What the effect is to draw its damage on.
void FillMatteGround(BgraPicture& picture);

// Turns a damaged ground into the matte, in place.
void ReadMatte(BgraPicture& picture);

}  // namespace velmora::hosts

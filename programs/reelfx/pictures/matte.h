// The damage of the effects as a separate picture, for compositing in other programs: wear, spots and scratches
// on a transparent background, with straight alpha (colours not multiplied by it), as editors and their file
// formats expect. Laid over the picture, it gives the damaged picture.
//
// Each kind of damage turns a channel's value v into nearly a + b v, with the same a and b for all three
// channels. So the effect is drawn on a flat picture whose channels have three different levels; the results
// give the opacity and grey of every pixel.
#pragma once

#include <vector>

#include "programs/reelfx/media/bgra_picture.h"
#include "programs/reelfx/common/effect_choice.h"

namespace velmora::hosts {

// Effects without damage leave a matte alone. Throws UsageError when no effect makes damage, or one makes damage that
// a matte with one opacity for all channels cannot show.
void CheckMatte(const std::vector<EffectChoice>& choices);

// The picture on which the effect draws its damage.
void FillMatteGround(BgraPicture& picture);

// Turns the damaged picture into the matte, in place.
void ReadMatte(BgraPicture& picture);

}  // namespace velmora::hosts

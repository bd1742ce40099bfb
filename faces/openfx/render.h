// The actions that concern pictures.
//
// The picture of an effect is the source's region of definition, in pixels of the scale that the host renders at: sizes
// of spots, shifts and scratches are those that a picture of so many pixels has in every other program of ours. All of
// it is asked for and rendered, whatever part of it the host wants.
#pragma once

#include "faces/openfx/instance.h"

namespace velmora::hosts::openfx {

OfxStatus AnswerRegionOfDefinition(const Instance& instance, const Properties& in, const Properties& out);
OfxStatus AnswerRegionsOfInterest(const Instance& instance, const Properties& in, const Properties& out);
OfxStatus AnswerIsIdentity(Instance& instance, const Properties& in, const Properties& out);
OfxStatus RenderFrame(Instance& instance, const Properties& in);

}  // namespace velmora::hosts::openfx

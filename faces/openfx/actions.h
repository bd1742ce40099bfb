// The actions of a plug-in that describe it and that concern pictures. They throw ActionFailed.
//
// The picture of an effect is the source's region of definition, in pixels of the scale that the host renders at: sizes
// of spots, shifts and scratches are those that a picture of so many pixels has in every other program of ours. A host
// may want a part of it. With jitter or diffusion all of it is asked for and rendered, otherwise that part alone.
#pragma once

#include <string_view>

#include "effects/effect_table.h"
#include "faces/openfx/host.h"
#include "faces/openfx/instance.h"

namespace velmora::hosts::openfx {

inline constexpr char kMaskClipName[] = "Mask";

// kOfxActionDescribe and kOfxImageEffectActionDescribeInContext for an effect's descriptor (describe.cpp).
void Describe(const Suites& suites, OfxImageEffectHandle descriptor, const effects::EffectTable& effect);
void DescribeInContext(const Suites& suites, OfxImageEffectHandle descriptor,
                       const effects::EffectTable& effect, std::string_view context);

// The answers for an instance (render.cpp). A host reads its usual answer where they give kOfxStatReplyDefault.
OfxStatus AnswerRegionOfDefinition(const Instance& instance, const Properties& in, const Properties& out);
OfxStatus AnswerRegionsOfInterest(Instance& instance, const Properties& in, const Properties& out);
OfxStatus AnswerIsIdentity(Instance& instance, const Properties& in, const Properties& out);

// Renders the window that the host names, if it is not stopped before. From any number of threads at once.
OfxStatus RenderFrame(Instance& instance, const Properties& in);

}  // namespace velmora::hosts::openfx

// How a plug-in describes itself to a host.
#pragma once

#include "effects/effect_table.h"
#include "faces/openfx/host.h"

namespace velmora::hosts::openfx {

inline constexpr char kMaskClipName[] = "Mask";

// kOfxActionDescribe and kOfxImageEffectActionDescribeInContext for an effect's descriptor. Both throw ActionFailed.
void Describe(const Suites& suites, OfxImageEffectHandle descriptor, const effects::EffectTable& effect);
void DescribeInContext(const Suites& suites, OfxImageEffectHandle descriptor,
                       const effects::EffectTable& effect, std::string_view context);

}  // namespace velmora::hosts::openfx

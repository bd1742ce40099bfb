// The reference for comparing frames: stage by stage, each over the whole picture and with the plain rules.
#pragma once

#include "render/renderer.h"

namespace velmora::testing {

// Like render::RenderStages and FrameContext::Finish, for frames that may overlap.
void RenderByStages(render::FrameContext& context, const render::StageSettings& settings,
                    render::RenderState& state, bool isDamageOnly = false);

// Applies wear to a row, one byte of the wear picture at a time.
void WearRow(const render::WearStage& stage, render::Bgra* row, std::int32_t width, std::int32_t y);

}  // namespace velmora::testing

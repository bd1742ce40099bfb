// The reference that frames are compared with: stage by stage, each over the whole picture and with the plain rules.
#pragma once

#include "render/renderer.h"

namespace velmora::testing {

// As render::RenderStages and FrameContext::Finish, for frames that may overlap.
void RenderByStages(render::FrameContext& context, const render::StageSettings& settings,
                    render::RenderState& state, bool isDamageOnly = false);

// A row under wear, byte by byte of its picture.
void WearRow(const render::WearStage& stage, render::Bgra* row, std::int32_t width, std::int32_t y);

}  // namespace velmora::testing

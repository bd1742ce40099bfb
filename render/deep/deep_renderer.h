// Renders deep pictures: the frame passes through the same chain of stages (render/chain.h) as an 8-bit one, with the
// same settings and the same random draws, but in floating point from one end to the other. Nothing is rounded between
// the stages, so the result is the 8-bit one without its rounding and dither.
//
// A number that is not one counts as 0. Alpha is kept. Below black and above white the stages of the look continue in
// straight lines, unless their formulas are bounded (render/deep/deep_tone.h); damage moves a channel toward white or
// black and never beyond.
#pragma once

#include "render/deep/deep_frame.h"
#include "render/deep/deep_memory.h"
#include "render/frame_context.h"
#include "render/render_state.h"
#include "render/renderer.h"
#include "render/stage_settings.h"

namespace velmora::render {

// Renders the window of a frame. The frame must be valid and the random state must have been started for it;
// `context`, made of the frame's size, has its time. Without memory for glow the picture gets none; without memory for
// a copy of a source that the destination overlaps, nothing is written and the result is false.
//
// Allocates only for the first frame of a size. Frames rendered at the same time need a state and a memory each.
[[nodiscard]] bool RenderDeep(const DeepFrame& frame, const FrameContext& context,
                              const StageSettings& settings, RenderState& state, DeepMemory& memory,
                              const RenderOptions& options = {}) noexcept;

}  // namespace velmora::render

// A frame's way through the chain of stages (render/chain.h).
//
// First the frame is planned: every stage makes its random draws and its tables, in the chain's order. Then the pixels
// are worked on row by row, each row through all stages while it lies in the nearest cache.
#pragma once

#include <cstdint>

#include "render/chain.h"
#include "render/frame_context.h"
#include "render/kernels.h"
#include "render/render_state.h"
#include "render/stage_settings.h"

namespace velmora::render {

struct RenderOptions {
    SimdLevel level = BestSimdLevel();  // of the pixel kernels
    // From this size on a result, which nobody can find in a cache again, is written past the caches.
    std::int64_t streamedBytes = std::int64_t{6} << 20;
    // Wear, scratches and spots alone, as they lie on the frame when all stages run.
    bool isDamageOnly = false;
};

// All but glow, which starts from the picture itself.
[[nodiscard]] FramePlan PlanFrame(const FrameContext& context, const StageSettings& settings,
                                  RenderState& state, const Kernels& kernels) noexcept;

// Runs the stages on a frame whose two views are valid and whose random state has been begun. The result is
// in the destination when a stage had something to do, else FrameContext::Finish copies the source through.
void RenderStages(FrameContext& context, const StageSettings& settings, RenderState& state,
                  const RenderOptions& options = {}) noexcept;

// How many numbers of the frame sequence a frame takes: the same for all frames of the same settings and
// width, so that the state of any frame of a running sequence can be told.
[[nodiscard]] std::uint32_t DrawsPerFrame(const StageSettings& settings, std::int32_t width) noexcept;

}  // namespace velmora::render

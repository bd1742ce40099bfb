// A frame's way through the chain of stages (render/chain.h).
//
// The frame is planned first: every stage makes its random draws and its tables, in the chain's order. The pixels are
// then processed row by row, each row through all stages while it is in the first-level cache.
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
    // Results of at least this size bypass the caches, since they would not stay there until they are read.
    std::int64_t streamedBytes = std::int64_t{6} << 20;
    // Only wear, scratches and spots, placed as when all stages run.
    bool isDamageOnly = false;
    // The rows that an 8-bit render has to write. Without jitter and glow it reads no others.
    RowRange rows = {};
};

// Whether a stage runs with these options.
template <typename Stage>
[[nodiscard]] bool IsWanted(const Stage&, const RenderOptions& options) noexcept {
    return Stage::kIsDamage || !options.isDamageOnly;
}
// Takes the others out of the plan.
void KeepWanted(FramePlan& plan, const RenderOptions& options) noexcept;

// All but glow, which starts from the picture itself.
[[nodiscard]] FramePlan PlanFrame(const FrameContext& context, const StageSettings& settings,
                                  RenderState& state, const Kernels& kernels) noexcept;

// Runs the stages on a frame. Both views must be valid and the random state must have been started for the frame. The
// result is in the destination if a stage had something to do; else FrameContext::Finish copies the source through.
void RenderStages(FrameContext& context, const StageSettings& settings, RenderState& state,
                  const RenderOptions& options = {}) noexcept;

// How many numbers of the frame sequence a frame takes. All frames with the same settings and width take the same
// number, so the random state of any frame in a sequence can be computed.
[[nodiscard]] std::uint32_t DrawsPerFrame(const StageSettings& settings, std::int32_t width) noexcept;

}  // namespace velmora::render

// A frame's way through the stages.
//
// First the frame is planned: every stage makes its random draws and its tables, in the chain's order. Then
// the pixels are worked on, along one of two roads that give the same bytes:
//   by rows, each row through all stages while it lies in the nearest cache (what is used);
//   by stages, each over the whole picture with the plain pixel forms (the reference).
#pragma once

#include <cstdint>

#include "render/colour.h"
#include "render/frame_context.h"
#include "render/glow.h"
#include "render/jitter.h"
#include "render/kernels.h"
#include "render/render_state.h"
#include "render/scratches.h"
#include "render/spots.h"
#include "render/stage_settings.h"
#include "render/tint.h"
#include "render/wear.h"

namespace velmora::render {

enum class Road { kByRows, kByStages };

struct RenderOptions {
    Road road = Road::kByRows;
    SimdLevel level = BestSimdLevel();  // of the pixel kernels, by rows
    // From this size on a result, which nobody can find in a cache again, is written past the caches.
    std::int64_t streamedBytes = std::int64_t{6} << 20;
    // Wear, scratches and spots alone, as they lie on the frame when all stages run.
    bool isDamageOnly = false;
};

// What the stages do to one frame.
struct FramePlan {
    JitterStage jitter;
    GlowStage glow;
    ColourStage colour;
    TintStage tint;
    WearStage wear;
    const WearFactors* wearFactors = nullptr;
    ScratchStage scratches;
    SpotStage spots;
};

// All but glow, which starts from the picture itself. `kernels` draw the scratches.
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

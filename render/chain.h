// The chain of stages: which stages exist and in which order a picture passes through them.
//
// Planning a frame, running it row by row, rendering damage only and counting draws all use this list. A stage has
//   IsActive()             whether it has something to do in this frame,
//   kIsDamage              whether it is part of a film's damage rather than of its look,
//   Draws(settings, width) how many numbers of the frame sequence it takes; the same in all frames with the same
//                          settings and width.
// To add a stage, add a member, its name in kStages in the right place, its preparation in renderer.cpp and its work on a
// row in row_program.h.
#pragma once

#include <cstddef>
#include <tuple>

#include "render/colour.h"
#include "render/glow.h"
#include "render/jitter.h"
#include "render/scratches.h"
#include "render/spots.h"
#include "render/tint.h"
#include "render/wear.h"

namespace velmora::render {

// What the stages do to one frame.
struct FramePlan {
    JitterStage jitter;
    GlowStage glow;
    ColourStage colour;
    TintStage tint;
    WearStage wear;
    ScratchStage scratches;
    SpotStage spots;
};

// In the chain's order.
inline constexpr auto kStages =
    std::make_tuple(&FramePlan::jitter, &FramePlan::glow, &FramePlan::colour, &FramePlan::tint,
                    &FramePlan::wear, &FramePlan::scratches, &FramePlan::spots);
inline constexpr std::size_t kStageCount = std::tuple_size_v<decltype(kStages)>;

// Calls visit(stage) for each stage of a plan, in the chain's order.
template <typename Plan, typename Visit>
void ForEachStage(Plan& plan, Visit&& visit) {
    std::apply([&](const auto... stage) { (visit(plan.*stage), ...); }, kStages);
}

}  // namespace velmora::render

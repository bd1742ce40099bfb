// The chain of stages: which there are and in which order a picture passes through them.
//
// Planning a frame, running it by rows, damage alone and the count of draws all go by this list. A stage says of itself
//   IsActive()             whether it has something to do in this frame,
//   kIsDamage              whether it is part of a film's damage rather than of its look,
//   Draws(settings, width) how many numbers of the frame sequence it takes: the same in all frames of the same
//                          settings and width.
// To add one: a member and a line here, in its place; how it is prepared, in renderer.cpp; what it does to a row, in
// row_program.h.
#pragma once

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

// Calls visit(stage) for each stage of a plan, in the chain's order.
template <typename Plan, typename Visit>
void ForEachStage(Plan& plan, Visit&& visit) {
    visit(plan.jitter);
    visit(plan.glow);
    visit(plan.colour);
    visit(plan.tint);
    visit(plan.wear);
    visit(plan.scratches);
    visit(plan.spots);
}

}  // namespace velmora::render

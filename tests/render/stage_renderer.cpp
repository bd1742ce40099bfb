#include "tests/render/stage_renderer.h"

#include <algorithm>
#include <cstring>

#include "tests/render/plain_picture.h"

namespace velmora::testing {
namespace {

using namespace render;

// The pixel at (y, x) is the input's at (y - dy, x - dx), the border where there is none.
void Apply(const JitterStage& stage, std::uint32_t border, PlainPicture& picture) {
    const PlainPicture input = picture;
    for (std::int32_t y = 0; y < picture.Height(); ++y) {
        for (std::int32_t x = 0; x < picture.Width(); ++x) {
            const std::int32_t fromY = y - stage.Dy(), fromX = x - stage.Dx();
            const bool isInside =
                fromY >= 0 && fromY < picture.Height() && fromX >= 0 && fromX < picture.Width();
            Bgra* const pixel = picture.Row(y) + x;
            if (isInside) *pixel = input.Row(fromY)[fromX];
            if (!isInside) std::memcpy(pixel, &border, sizeof border);
        }
    }
}

void Apply(const ColourStage& stage, PlainPicture& picture) {
    const ByteTable& tone = stage.Tone();
    for (Bgra& p : picture.Pixels()) {
        p = {tone[p.blue], tone[p.green], tone[p.red], p.alpha};
        if (stage.Mixes()) p = MixWithGrey(p, stage.Weight());
    }
}

void Apply(const TintStage& stage, PlainPicture& picture) {
    for (Bgra& p : picture.Pixels())
        p = {stage.Blue()[p.blue], stage.Green()[p.green], stage.Red()[p.red], p.alpha};
}

void Apply(const WearStage& stage, PlainPicture& picture) {
    for (std::int32_t y = 0; y < picture.Height(); ++y) WearRow(stage, picture.Row(y), picture.Width(), y);
}

// Stages without a rule of their own here.
template <typename Stage>
void Apply(const Stage& stage, PlainPicture& picture) {
    for (std::int32_t y = 0; y < picture.Height(); ++y) {
        stage.Row(picture.Row(y), picture.Row(y), picture.Width(), y);
    }
}

}  // namespace

void WearRow(const WearStage& stage, Bgra* row, std::int32_t width, std::int32_t y) {
    stage.ForEachByte(width, y, [&](std::int32_t x, std::uint8_t byte) { stage.ShadeUnder(byte, row[x]); });
}

void RenderByStages(FrameContext& context, const StageSettings& settings, RenderState& state,
                    bool isDamageOnly) {
    FramePlan plan = PlanFrame(context, settings, state, kPlainKernels);
    PlainPicture picture(context.Width(), context.Height());
    for (std::int32_t y = 0; y < picture.Height(); ++y) {
        std::copy_n(context.Source().Row(y), picture.Width(), picture.Row(y));
    }
    if (!isDamageOnly) {
        if (plan.jitter.IsActive()) Apply(plan.jitter, settings.borderColour, picture);
        plan.glow =
            PrepareGlow(settings.glow, picture, picture.Width(), picture.Height(), state.glow, kPlainGlow);
        if (plan.glow.IsActive()) Apply(plan.glow, picture);
        if (plan.colour.IsActive()) Apply(plan.colour, picture);
        if (plan.tint.IsActive()) Apply(plan.tint, picture);
    }
    if (plan.wear.IsActive()) Apply(plan.wear, picture);
    if (plan.scratches.IsActive()) Apply(plan.scratches, picture);
    if (plan.spots.IsActive()) Apply(plan.spots, picture);
    const ImageView& destination = context.ClaimDestination();
    for (std::int32_t y = 0; y < picture.Height(); ++y) {
        std::copy_n(picture.Row(y), picture.Width(), destination.Row(y));
    }
}

}  // namespace velmora::testing

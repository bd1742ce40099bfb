#include "render/renderer.h"

#include "render/row_program.h"

namespace velmora::render {
namespace {

// The chain behind jitter, in its order: what both roads run. `visit` takes a stage.
template <typename Visit>
void ForEachActiveStage(const FramePlan& plan, Visit&& visit) {
    if (plan.glow.IsActive()) visit(plan.glow);
    if (plan.colour.IsActive()) visit(plan.colour);
    if (plan.tint.IsActive()) visit(plan.tint);
    if (plan.wear.IsActive()) visit(plan.wear);
    if (plan.scratches.IsActive()) visit(plan.scratches);
    if (plan.spots.IsActive()) visit(plan.spots);
}

// One stage over the whole picture: from the current input into the destination.
template <typename Stage>
void ApplyStage(const Stage& stage, FrameContext& context) noexcept {
    const ImageView* input = context.CurrentInput(true);
    if (input == nullptr) return;
    const ImageView& output = context.ClaimDestination();
    for (std::int32_t y = 0; y < context.Height(); ++y) {
        stage.Row(input->Row(y), output.Row(y), context.Width(), y);
    }
}

void RenderByStages(FrameContext& context, const FramePlan& plan) noexcept {
    if (plan.jitter.IsActive()) plan.jitter.Apply(context);
    ForEachActiveStage(plan, [&context](const auto& stage) { ApplyStage(stage, context); });
}

// In place, what was read is still in the caches when it is written.
bool IsStreamed(const FrameContext& context, const RenderOptions& options) noexcept {
    const std::int64_t bytes =
        std::int64_t{context.Width()} * context.Height() * static_cast<std::int64_t>(sizeof(Bgra));
    return bytes >= options.streamedBytes && !context.FramesOverlap();
}

void RenderByRows(FrameContext& context, const FramePlan& plan, const RenderOptions& options,
                  RowMemory& memory) noexcept {
    const RowProgram program(plan, KernelsOf(options.level));
    Bgra* const room = IsStreamed(context, options) ? memory.Reserve(context.Width()) : nullptr;
    if (room == nullptr && !plan.jitter.IsActive() && program.IsEmpty()) return;
    const ImageView& source = context.Source();
    const ImageView& destination = context.ClaimDestination();
    for (std::int32_t y = 0; y < context.Height(); ++y) {
        const ShiftedRow row = plan.jitter.Shifted(source, y);
        if (room == nullptr) {
            program.Run(row, destination.Row(y), context.Width(), y);
        } else {
            program.Stream(row, room, destination.Row(y), context.Width(), y);
        }
    }
    if (room != nullptr) program.EndStream();
}

// In place the rows can be worked on where they lie, unless the picture moves over itself.
bool NeedsOwnSource(const FrameContext& context, const FramePlan& plan) noexcept {
    if (!context.FramesOverlap()) return false;
    const ImageView& source = context.Source();
    const ImageView& destination = context.Destination();
    const bool sameRows = source.Row(0) == destination.Row(0) && source.rowStep == destination.rowStep;
    return plan.jitter.IsActive() || !sameRows;
}

}  // namespace

FramePlan PlanFrame(const FrameContext& context, const StageSettings& settings, RenderState& state,
                    const Kernels& kernels) noexcept {
    Random& random = state.random.Numbers();
    FramePlan plan;
    plan.jitter = PrepareJitter(settings, random);
    plan.colour = PrepareColour(settings, context.Time(), state.contrast);
    plan.tint = PrepareTint(settings);
    plan.wear = PrepareWear(settings, context.Width(), random);
    if (plan.wear.IsActive()) state.wear.Set(plan.wear.Picture(), plan.wear.Amount());
    plan.wearFactors = &state.wear;
    plan.scratches = PrepareScratches(settings, plan.jitter.Dx(), context, state.scratches, kernels);
    plan.spots = PrepareSpots(settings, context.Destination().Region(), random);
    return plan;
}

void RenderStages(FrameContext& context, const StageSettings& settings, RenderState& state,
                  const RenderOptions& options) noexcept {
    const Kernels& kernels = options.road == Road::kByStages ? kPlainKernels : KernelsOf(options.level);
    FramePlan plan = PlanFrame(context, settings, state, kernels);
    if (options.isDamageOnly) plan.jitter = {}, plan.colour = {}, plan.tint = {};
    // Without memory for the copy the picture stays where it is; the other stages can still work.
    if (NeedsOwnSource(context, plan) && !context.DetachSource()) plan.jitter = {};
    const ShakenRows shaken(context.Source(), plan.jitter);
    const float glow = options.isDamageOnly ? 0.0f : settings.glow;
    plan.glow = PrepareGlow(glow, shaken, context.Width(), context.Height(), state.glow, *kernels.glow);
    if (options.road == Road::kByStages) {
        RenderByStages(context, plan);
    } else {
        RenderByRows(context, plan, options, state.row);
    }
}

std::uint32_t DrawsPerFrame(const StageSettings& settings, std::int32_t width) noexcept {
    constexpr std::uint32_t kDrawsPerSpot = 6;
    const std::uint32_t jitter = settings.yJitter != 0 || settings.xJitter != 0 ? 2 : 0;
    const std::uint32_t wear = 1 + (settings.wear != 0.0f ? WearStripCount(settings, width) : 0);
    return jitter + wear + kDrawsPerSpot * SpotCount(settings);
}

}  // namespace velmora::render

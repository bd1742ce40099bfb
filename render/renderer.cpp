#include "render/renderer.h"

#include <algorithm>

#include "render/row_program.h"

namespace velmora::render {
namespace {

struct Planning {
    const FrameContext& context;
    const StageSettings& settings;
    RenderState& state;
    const Kernels& kernels;
    const FramePlan& plan;  // as far as it is prepared

    [[nodiscard]] Random& Numbers() const noexcept { return state.random.Numbers(); }
};

void Prepare(JitterStage& stage, const Planning& p) noexcept {
    stage = PrepareJitter(p.settings, p.Numbers());
}
void Prepare(GlowStage&, const Planning&) noexcept {}  // starts from the picture itself
void Prepare(ColourStage& stage, const Planning& p) noexcept {
    stage = PrepareColour(p.settings, p.context.Time(), p.state.contrast);
}
void Prepare(TintStage& stage, const Planning& p) noexcept {
    stage = PrepareTint(p.settings);
}
void Prepare(WearStage& stage, const Planning& p) noexcept {
    stage = PrepareWear(p.settings, p.context.Width(), p.Numbers(), p.state.wear, p.kernels);
}
void Prepare(ScratchStage& stage, const Planning& p) noexcept {
    stage = PrepareScratches(p.settings, p.plan.jitter.Dx(), p.context, p.state.scratches, p.kernels);
}
void Prepare(SpotStage& stage, const Planning& p) noexcept {
    stage = PrepareSpots(p.settings, p.context.Destination().Region(), p.Numbers());
}

// Not when working in place: what was read is then still in the caches when it is written.
bool IsStreamed(const FrameContext& context, const RenderOptions& options) noexcept {
    const std::int64_t bytes =
        std::int64_t{context.Width()} * context.Height() * static_cast<std::int64_t>(sizeof(Bgra));
    return bytes >= options.streamedBytes && !context.FramesOverlap();
}

void RenderByRows(FrameContext& context, const FramePlan& plan, const RenderOptions& options,
                  const Kernels& kernels, GrowingMemory<Bgra>& memory) noexcept {
    const RowProgram program(plan, kernels);
    const auto width = static_cast<std::uint64_t>(context.Width());
    Bgra* const own = IsStreamed(context, options) ? memory.Reserve(width) : nullptr;
    if (own == nullptr && !plan.jitter.IsActive() && program.IsEmpty()) return;
    const ImageView& source = context.Source();
    const ImageView& destination = context.ClaimDestination();
    const std::int32_t end = std::min(context.Height(), options.rows.end);
    for (std::int32_t y = std::max(options.rows.first, 0); y < end; ++y) {
        const ShiftedRow row = plan.jitter.Shifted(source, y);
        if (own == nullptr) {
            program.Run(row, destination.Row(y), context.Width(), y);
        } else {
            program.Stream(row, own, destination.Row(y), context.Width(), y);
        }
    }
    if (own != nullptr) program.EndStream();
}

// Rows can be processed in place, unless the picture is shifted over itself.
bool NeedsOwnSource(const FrameContext& context, const FramePlan& plan) noexcept {
    if (!context.FramesOverlap()) return false;
    const ImageView& source = context.Source();
    const ImageView& destination = context.Destination();
    const bool sameRows = source.Row(0) == destination.Row(0) && source.rowStep == destination.rowStep;
    return plan.jitter.IsActive() || !sameRows;
}

}  // namespace

void KeepWanted(FramePlan& plan, const RenderOptions& options) noexcept {
    ForEachStage(plan, [&options](auto& stage) {
        if (!IsWanted(stage, options)) stage = {};
    });
}

FramePlan PlanFrame(const FrameContext& context, const StageSettings& settings, RenderState& state,
                    const Kernels& kernels) noexcept {
    FramePlan plan;
    const Planning planning = {context, settings, state, kernels, plan};
    ForEachStage(plan, [&planning](auto& stage) { Prepare(stage, planning); });
    return plan;
}

void RenderStages(FrameContext& context, const StageSettings& settings, RenderState& state,
                  const RenderOptions& options) noexcept {
    const Kernels& kernels = KernelsOf(options.level);
    FramePlan plan = PlanFrame(context, settings, state, kernels);
    KeepWanted(plan, options);
    // Without memory for the copy the picture is not shifted; the other stages can still work.
    if (NeedsOwnSource(context, plan) && !context.DetachSource()) plan.jitter = {};
    const ShakenRows shaken(context.Source(), plan.jitter);
    if (IsWanted(plan.glow, options)) {
        plan.glow =
            PrepareGlow(settings.glow, shaken, context.Width(), context.Height(), state.glow, *kernels.glow);
    }
    RenderByRows(context, plan, options, kernels, state.row);
}

std::uint32_t DrawsPerFrame(const StageSettings& settings, std::int32_t width) noexcept {
    std::uint32_t draws = 0;
    const FramePlan plan;
    ForEachStage(plan, [&](const auto& stage) { draws += stage.Draws(settings, width); });
    return draws;
}

}  // namespace velmora::render

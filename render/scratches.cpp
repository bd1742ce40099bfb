#include "render/scratches.h"

#include <algorithm>
#include <cstring>

#include "render/kernels.h"
#include "render/rounding.h"
#include "render/scratch_span.h"

namespace velmora::render {
namespace {

#include "render/scratch_rows.inc"

void DrawSpan(Bgra* span, const std::uint16_t* weights, std::int32_t pixels, std::uint32_t strength,
              bool isWhite) noexcept {
    for (std::int32_t i = 0; i < pixels; ++i) DrawPixel(span[i], weights[i], strength, isWhite);
}

}  // namespace

void DrawScratchesPlain(const ScratchLine* lines, std::uint32_t count, Bgra* row, std::int32_t width,
                        const ScratchRowPlace& place) noexcept {
    DrawLines(lines, count, row, width, place);
}

ScratchStage::ScratchStage(const ScratchLine* lines, std::uint32_t count, std::int32_t height,
                           const Kernels& kernels) noexcept
    : m_lines(lines),
      m_count(count),
      m_knotStep((std::uint64_t{ScratchLine::kSegments} << 16) / static_cast<std::uint64_t>(height)),
      m_kernels(&kernels) {}

ScratchRowPlace ScratchStage::PlaceOf(std::int32_t y) const noexcept {
    const std::uint64_t along = m_knotStep * static_cast<std::uint64_t>(y);
    return {y, static_cast<std::size_t>(along >> 16), static_cast<std::int32_t>(along & 0xFFFF) >> 4};
}

void ScratchStage::Row(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept {
    if (in != out) std::memcpy(out, in, static_cast<std::size_t>(width) * sizeof(Bgra));
    m_kernels->scratches(m_lines, m_count, out, width, PlaceOf(y));
}

ScratchStage PrepareScratches(const StageSettings& settings, std::int32_t xOffset,
                              const FrameContext& context, ScratchMemory& memory,
                              const Kernels& kernels) noexcept {
    const std::int32_t depth = std::clamp(RoundHalfAway(settings.scratchDepth * 65535.0), 0, 65535);
    const std::uint32_t count = std::min(settings.scratchCount, kMostScratches);
    if (depth == 0 || count == 0) return {};
    const std::int32_t frame = ScratchFrame(context.FrameNumber());
    const ScratchReplay& replay = memory.replays.At(ReplayKeyOf(settings), frame);
    const ScratchStray stray(context.Width(), context.Height());
    for (std::uint32_t i = 0; i < count; ++i) {
        const ScratchState scratch = ScratchStateAt(replay.LifeOf(i), frame, settings, context.Width());
        ScratchLine& line = memory.lines[i];
        line.pixel = static_cast<std::int32_t>(scratch.position / 1000) + xOffset;
        LayScratch(scratch, {.frame = frame, .depth = depth, .isFirst = i == 0}, stray, line);
    }
    return {memory.lines.data(), count, context.Height(), kernels};
}

}  // namespace velmora::render

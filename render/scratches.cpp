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

void FindSpans(const ScratchLine& line, const ScratchRows& rows, ScratchSpans& spans) noexcept {
    for (std::size_t i = 0; i < rows.count; ++i) {
        ScratchSpan span;
        const ScratchRowPlace place = {rows.y + static_cast<std::int32_t>(i), rows.knot, rows.parts[i]};
        const bool isThere = FindSpan(line, place, span);
        spans.first[i] = span.first;
        spans.place[i] = isThere ? static_cast<std::uint16_t>(span.place) : ScratchSpans::kNone;
        spans.strength[i] = static_cast<std::uint16_t>(span.strength);
    }
}

void FindLines(const ScratchLine* lines, std::uint32_t count, const ScratchRows& rows,
               ScratchSpans* spans) noexcept {
    for (std::uint32_t i = 0; i < count; ++i) FindSpans(lines[i], rows, spans[i]);
}

}  // namespace

const ScratchKernels kPlainScratches = {FindLines, DrawLines};

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
    const std::int32_t first = m_rows.y, end = first + static_cast<std::int32_t>(m_rows.count);
    if (y < first || y >= end) Find(y);
    m_kernels->scratches->draw(m_lines, m_spans.data(), m_count, static_cast<std::size_t>(y - m_rows.y), out,
                               width);
}

void ScratchStage::Find(std::int32_t y) const noexcept {
    const ScratchRowPlace first = PlaceOf(y);
    m_rows.y = y;
    m_rows.knot = first.knot;
    m_rows.count = 0;
    for (ScratchRowPlace next = first; next.knot == first.knot && m_rows.count < ScratchRows::kMost;
         next = PlaceOf(next.y + 1)) {
        m_rows.parts[m_rows.count++] = next.part;
    }
    m_kernels->scratches->find(m_lines, m_count, m_rows, m_spans.data());
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

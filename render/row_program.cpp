#include "render/row_program.h"

#include <algorithm>
#include <array>

namespace velmora::render {
namespace {

ByteTable Identity() noexcept {
    ByteTable table;
    for (std::size_t i = 0; i < table.size(); ++i) table[i] = static_cast<std::uint8_t>(i);
    return table;
}

// First `first`, then `second`.
ByteTable Joined(const ByteTable& first, const ByteTable& second) noexcept {
    ByteTable table;
    for (std::size_t i = 0; i < table.size(); ++i) table[i] = second[first[i]];
    return table;
}

// The weights that the kernels' 16-bit arithmetic holds; settings from a slider lie within.
bool FitsKernel(std::int32_t weight) noexcept {
    return weight >= -127 && weight <= 127;
}

// For rows that are the source's but for a border, which is filled in where it goes to.
struct StreamOrCopy {
    const Kernels& kernels;
    void operator()(const Bgra* in, Bgra* out, std::int32_t count) const noexcept {
        if (in != out) kernels.stream(in, out, count);
    }
};

}  // namespace

RowProgram::RowProgram(const FramePlan& plan, const Kernels& kernels) noexcept
    : m_plan(plan), m_kernels(kernels) {
    PlanTables();
}

void RowProgram::PlanTables() noexcept {
    const ByteTable identity = Identity();
    const ColourStage& colour = m_plan.colour;
    const TintStage& tint = m_plan.tint;
    const ByteTable& tone = colour.IsActive() ? colour.Tone() : identity;
    m_tone.mixes = colour.IsActive() && colour.Mixes();
    m_tone.weight = m_tone.mixes ? colour.Weight() : 0;
    const bool staysLines = colour.IsActive() && !colour.Lines().empty() && !tint.IsActive();
    const bool goesBefore = m_tone.mixes || staysLines;
    if (goesBefore && tone != identity) {
        m_before.Set(tone, tone, tone);
        m_tone.before = &m_before;
        m_tone.lines = colour.Lines();
    }

    const ByteTable& first = goesBefore ? identity : tone;
    const ByteTable blue = tint.IsActive() ? Joined(first, tint.Blue()) : first;
    const ByteTable green = tint.IsActive() ? Joined(first, tint.Green()) : first;
    const ByteTable red = tint.IsActive() ? Joined(first, tint.Red()) : first;
    if (blue != identity || green != identity || red != identity) {
        m_after.Set(blue, green, red);
        m_tone.after = &m_after;
    }
}

bool RowProgram::IsEmpty() const noexcept {
    return !m_plan.glow.IsActive() && !m_tone.IsActive() && !m_plan.wear.IsActive() &&
           !m_plan.scratches.IsActive() && !m_plan.spots.IsActive();
}

void RowProgram::Stream(const ShiftedRow& in, Bgra* room, Bgra* out, std::int32_t width,
                        std::int32_t y) const noexcept {
    if (IsEmpty()) return FetchThrough(in, out, width, StreamOrCopy{m_kernels});
    Run(in, room, width, y);
    m_kernels.stream(room, out, width);
}

// Glow needs the pixel at its place, and so does wear; the first step behind the source otherwise takes the row
// from there.
void RowProgram::Run(const ShiftedRow& in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept {
    const auto toneRow = [this](const Bgra* from, Bgra* to, std::int32_t count) { RunTone(from, to, count); };
    const bool isWhole = in.count == width;
    const Bgra* row = isWhole ? in.pixels : out;
    const bool takesTone = m_tone.IsActive() && !m_plan.glow.IsActive();
    const bool takesRow = m_plan.glow.IsActive() || m_plan.wear.IsActive();
    if (takesTone) {
        FetchThrough(in, out, width, toneRow);
        row = out;
    } else if (!isWhole || (!takesRow && row != out)) {
        FetchThrough(in, out, width, m_kernels.copy);
        row = out;
    }
    if (m_plan.glow.IsActive()) {
        m_plan.glow.Row(row, out, width, y);
        row = out;
        if (m_tone.IsActive()) toneRow(out, out, width);
    }
    if (m_plan.wear.IsActive()) Wear(row, out, width, y);
    if (m_plan.scratches.IsActive()) m_plan.scratches.Row(out, out, width, y);
    if (m_plan.spots.IsActive()) m_plan.spots.Row(out, out, width, y);
}

template <typename Step>
void RowProgram::FetchThrough(const ShiftedRow& in, Bgra* out, std::int32_t width,
                              Step&& step) const noexcept {
    if (in.count != 0) step(in.pixels, out + in.start, in.count);
    const auto border = [&](std::int32_t start, std::int32_t count) {
        if (count == 0) return;
        FillPixels(out + start, count, in.border);
        step(out + start, out + start, count);
    };
    border(0, in.start);
    border(in.start + in.count, width - in.start - in.count);
}

void RowProgram::RunTone(const Bgra* in, Bgra* out, std::int32_t width) const noexcept {
    (FitsKernel(m_tone.weight) ? m_kernels : kPlainKernels).tone(in, out, width, m_tone);
}

void RowProgram::Wear(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept {
    const WearStage& wear = m_plan.wear;
    const WearFactors& factors = *m_plan.wearFactors;
    m_kernels.wear(in, out, width, factors.Over(wear.RowsOver(y)),
                   wear.BlueOnly() ? kBlueChannel : kColourChannels);
    if (!factors.HasOddBytes()) return;
    // These the kernel has left as they are.
    wear.ForEachByte(width, y, [&](std::int32_t x, std::uint8_t byte) {
        if (factors.IsOdd(byte)) wear.ShadeUnder(byte, out[x]);
    });
}

}  // namespace velmora::render

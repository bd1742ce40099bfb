#include "render/row_program.h"

#include <algorithm>
#include <array>
#include <cstring>

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
    const RowKernels& kernels;
    void operator()(const Bgra* in, Bgra* out, std::int32_t count) const noexcept {
        if (in != out) kernels.stream(in, out, count);
    }
};

}  // namespace

RowProgram::RowProgram(const FramePlan& plan, Form form) noexcept : m_plan(plan), m_kernels(KernelsOf(form)) {
    PlanTables();
}

void RowProgram::PlanTables() noexcept {
    const ByteTable identity = Identity();
    const ByteTable& tone = m_plan.colour.IsActive() ? m_plan.colour.Tone() : identity;
    m_mixes = m_plan.colour.IsActive() && m_plan.colour.Mixes();
    m_hasBefore = m_mixes && tone != identity;
    if (m_hasBefore) m_before.Set(tone, tone, tone);

    const ByteTable& first = m_mixes ? identity : tone;
    const bool tints = m_plan.tint.IsActive();
    const ByteTable blue = tints ? Joined(first, m_plan.tint.Blue()) : first;
    const ByteTable green = tints ? Joined(first, m_plan.tint.Green()) : first;
    const ByteTable red = tints ? Joined(first, m_plan.tint.Red()) : first;
    m_hasAfter = blue != identity || green != identity || red != identity;
    if (m_hasAfter) m_after.Set(blue, green, red);
}

bool RowProgram::IsEmpty() const noexcept {
    return !m_plan.glow.IsActive() && !m_mixes && !m_hasAfter && !m_plan.wear.IsActive() &&
           !m_plan.scratches.IsActive() && !m_plan.spots.IsActive();
}

void RowProgram::Stream(const ShiftedRow& in, Bgra* room, Bgra* out, std::int32_t width,
                        std::int32_t y) const noexcept {
    if (IsEmpty()) return FetchThrough(in, out, width, StreamOrCopy{m_kernels});
    Run(in, room, width, y);
    m_kernels.stream(room, out, width);
}

// Glow needs the pixel at its place; the first step behind the source otherwise takes the row from there.
void RowProgram::Run(const ShiftedRow& in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept {
    if (m_plan.glow.IsActive()) {
        const bool isWhole = in.count == width;
        if (!isWhole) FetchThrough(in, out, width, m_kernels.copy);
        m_plan.glow.Row(isWhole ? in.pixels : out, out, width, y);
        if (m_hasBefore) m_kernels.tables(out, out, width, m_before);
        if (m_mixes) Mix(out, out, width);
        if (m_hasAfter) m_kernels.tables(out, out, width, m_after);
    } else {
        FetchThroughTables(in, out, width);
    }
    if (m_plan.wear.IsActive()) Wear(out, width, y);
    if (m_plan.scratches.IsActive()) m_plan.scratches.Row(out, out, width, y);
    if (m_plan.spots.IsActive()) m_plan.spots.Row(out, out, width, y);
}

void RowProgram::FetchThroughTables(const ShiftedRow& in, Bgra* out, std::int32_t width) const noexcept {
    const auto tables = [this](const ChannelTables& t) {
        return [this, &t](const Bgra* from, Bgra* to, std::int32_t count) {
            m_kernels.tables(from, to, count, t);
        };
    };
    const auto mix = [this](const Bgra* from, Bgra* to, std::int32_t count) { Mix(from, to, count); };
    if (m_hasBefore) {
        FetchThrough(in, out, width, tables(m_before));
        Mix(out, out, width);
    } else if (m_mixes) {
        FetchThrough(in, out, width, mix);
    } else if (m_hasAfter) {
        return FetchThrough(in, out, width, tables(m_after));
    } else if (in.pixels != out || in.count != width) {
        FetchThrough(in, out, width, m_kernels.copy);
    }
    if (m_hasAfter) m_kernels.tables(out, out, width, m_after);
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

void RowProgram::Mix(const Bgra* in, Bgra* out, std::int32_t width) const noexcept {
    const std::int32_t weight = m_plan.colour.Weight();
    (FitsKernel(weight) ? m_kernels : kPlainKernels).mix(in, out, width, weight);
}

void RowProgram::Wear(Bgra* row, std::int32_t width, std::int32_t y) const noexcept {
    // The strips are narrow, so their fractions are lined up first and the kernel runs over all of them.
    constexpr std::int32_t kBatch = 2048;
    std::array<float, kBatch + 2 * kWidestWear> fractions;
    std::int32_t start = 0, filled = 0;
    const std::uint32_t channels = m_plan.wear.BlueOnly() ? kBlueChannel : kColourChannels;
    const auto flush = [&] {
        m_kernels.wear(row + start, row + start, filled, fractions.data(), channels);
        start += filled;
        filled = 0;
    };
    m_plan.wear.ForEachStrip(width, y, [&](std::int32_t, std::int32_t count, std::int32_t wearRow) {
        // A fixed size is copied at once; the next strip covers what is too much.
        std::memcpy(fractions.data() + filled, m_plan.wearFractions->From(wearRow),
                    sizeof(float) * kWidestWear);
        filled += count;
        if (filled >= kBatch) flush();
    });
    flush();
}

}  // namespace velmora::render

#include "render/row_program.h"

#include <algorithm>

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

void RowProgram::Run(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept {
    if (m_plan.glow.IsActive()) {
        m_plan.glow.Row(in, out, width, y);
        in = out;
    }
    if (m_hasBefore) {
        m_kernels.tables(in, out, width, m_before);
        in = out;
    }
    if (m_mixes) {
        const std::int32_t weight = m_plan.colour.Weight();
        (FitsKernel(weight) ? m_kernels : kPlainKernels).mix(in, out, width, weight);
        in = out;
    }
    if (m_hasAfter) {
        m_kernels.tables(in, out, width, m_after);
        in = out;
    }
    if (m_plan.wear.IsActive()) {
        RunWear(in, out, width, y);
        in = out;
    }
    if (m_plan.scratches.IsActive()) {
        m_plan.scratches.Row(in, out, width, y);
        in = out;
    }
    if (m_plan.spots.IsActive()) {
        m_plan.spots.Row(in, out, width, y);
        in = out;
    }
    if (in != out) m_kernels.copy(in, out, width);
}

void RowProgram::RunWear(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept {
    if (m_plan.wear.BlueOnly()) return m_plan.wear.Row(in, out, width, y);
    m_plan.wear.ForEachStrip(width, y, [&](std::int32_t x, std::int32_t count, const std::uint8_t* bytes) {
        m_kernels.wear(in + x, out + x, count, bytes, m_plan.wear.Fractions());
    });
}

}  // namespace velmora::render

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

// The weights that fit the kernels' 16-bit arithmetic. Slider settings are always within this range.
bool FitsKernel(std::int32_t weight) noexcept {
    return weight >= -127 && weight <= 127;
}

// For rows that are source pixels plus a border. The border is filled in directly in the output, so in == out there.
struct StreamOrCopy {
    const Kernels& kernels;
    void operator()(const Bgra* in, Bgra* out, std::int32_t count) const noexcept {
        if (in != out) kernels.stream(in, out, count);
    }
};

}  // namespace

RowProgram::RowProgram(const FramePlan& plan, const Kernels& kernels) noexcept : m_kernels(kernels) {
    PlanTone(plan.colour, plan.tint);
    ForEachStage(plan, [this](const auto& stage) {
        if (stage.IsActive()) Add(stage);
    });
}

template <typename Stage>
void RowProgram::AddStage(const Stage& stage, Reads reads) noexcept {
    m_steps[m_count++] = {
        reads, &stage,
        [](const RowProgram&, const void* own, const Bgra* in, Bgra* out, std::int32_t width,
           std::int32_t y) { static_cast<const Stage*>(own)->Row(in, out, width, y); }};
}

void RowProgram::AddTone() noexcept {
    if (m_hasTone || !m_tone.IsActive()) return;
    m_hasTone = true;
    m_steps[m_count++] = {Reads::kPixels, nullptr,
                          [](const RowProgram& program, const void*, const Bgra* in, Bgra* out,
                             std::int32_t width, std::int32_t) { program.RunTone(in, out, width); }};
}

void RowProgram::PlanTone(const ColourStage& colour, const TintStage& tint) noexcept {
    const ByteTable identity = Identity();
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

void RowProgram::Stream(const ShiftedRow& in, Bgra* scratch, Bgra* out, std::int32_t width,
                        std::int32_t y) const noexcept {
    if (IsEmpty()) return FetchThrough(in, out, width, StreamOrCopy{m_kernels});
    Run(in, scratch, width, y);
    m_kernels.stream(scratch, out, width);
}

void RowProgram::Run(const ShiftedRow& in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept {
    const bool isWhole = in.count == width;
    const Bgra* row = out;
    std::size_t next = 0;
    if (m_glow != nullptr || (m_count != 0 && m_steps[0].reads == Reads::kPixels)) {
        next = RunFirst(in, out, width, y);
    } else if (m_count != 0 && m_steps[0].reads == Reads::kRow && isWhole) {
        row = in.pixels;
    } else if (!isWhole || in.pixels != out) {
        FetchThrough(in, out, width, m_kernels.copy);
    }
    for (; next < m_count; ++next) {
        m_steps[next].run(*this, m_steps[next].stage, row, out, width, y);
        row = out;
    }
}

// Glow and tone in one step, if possible.
bool RowProgram::TonesUnderGlow() const noexcept {
    return m_kernels.glowedTone != nullptr && m_hasTone && FitsKernel(m_tone.weight) && m_glow->HasPlanes();
}

// Glow or tone, or both, directly from the source. Returns the number of steps done.
std::size_t RowProgram::RunFirst(const ShiftedRow& in, Bgra* out, std::int32_t width,
                                 std::int32_t y) const noexcept {
    if (m_glow == nullptr) {
        const auto tone = [&](const Bgra* from, Bgra* to, std::int32_t count) { RunTone(from, to, count); };
        m_kernels.tonesShortRows ? FetchThrough(in, out, width, tone) : FetchParts(in, out, width, tone);
        return 1;
    }
    if (TonesUnderGlow()) {
        const GlowPlanes layer = m_glow->PlanesOver(width, y, m_kernels.glowedTone->split);
        FetchParts(in, out, width, [&](const Bgra* from, Bgra* to, std::int32_t count) {
            m_kernels.glowedTone->tone(from, to, count, m_tone,
                                       layer.From(static_cast<std::int32_t>(to - out)));
        });
        return 1;
    }
    const GlowRow layer = m_glow->Over(width, y);
    FetchParts(in, out, width, [&](const Bgra* from, Bgra* to, std::int32_t count) {
        layer.From(static_cast<std::int32_t>(to - out)).Screen(from, to, count);
    });
    return 0;
}

// Calls work(from, to, count) for parts of the row that begin at multiples of kPart columns: for those with border
// pixels in place, for the others from the source.
template <typename Work>
void RowProgram::FetchParts(const ShiftedRow& in, Bgra* out, std::int32_t width, Work&& work) const noexcept {
    constexpr std::int32_t kPart = 64;  // the longest step of a kernel: only a row's end is shorter
    const std::int32_t end = in.start + in.count == width ? width : (in.start + in.count) / kPart * kPart;
    const std::int32_t first = std::min((in.start + kPart - 1) / kPart * kPart, width);
    if (first >= end) {
        in.Copy(0, width, out);
        return work(out, out, width);
    }
    const auto inPlace = [&](std::int32_t from, std::int32_t to) {
        if (from == to) return;
        in.Copy(from, to, out + from);
        work(out + from, out + from, to - from);
    };
    inPlace(0, first);
    work(in.pixels + (first - in.start), out + first, end - first);
    inPlace(end, width);
}

template <typename Work>
void RowProgram::FetchThrough(const ShiftedRow& in, Bgra* out, std::int32_t width,
                              Work&& work) const noexcept {
    if (in.count != 0) work(in.pixels, out + in.start, in.count);
    const auto border = [&](std::int32_t start, std::int32_t count) {
        if (count == 0) return;
        FillPixels(out + start, count, in.border);
        work(out + start, out + start, count);
    };
    border(0, in.start);
    border(in.start + in.count, width - in.start - in.count);
}

void RowProgram::RunTone(const Bgra* in, Bgra* out, std::int32_t width) const noexcept {
    (FitsKernel(m_tone.weight) ? m_kernels : kPlainKernels).tone(in, out, width, m_tone);
}

}  // namespace velmora::render

#include "render/deep/deep_row_program.h"

#include <algorithm>
#include <cstring>

#include "render/spots.h"

namespace velmora::render {
namespace {

// The kernels' entry for a format.
std::size_t SamplesOf(const DeepFormat& format) noexcept {
    return format.samples == DeepSamples::kFloat ? 1 : 0;
}
std::size_t ChannelsOf(const DeepFormat& format) noexcept {
    return static_cast<std::size_t>(format.channels - 3);
}

void FillBorder(DeepBlock& block, std::int32_t at, std::int32_t count, std::uint32_t colour,
                bool hasAlpha) noexcept {
    if (count <= 0) return;
    const auto channel = [colour](int shift) { return static_cast<float>(colour >> shift & 0xFFu) / 255.0f; };
    std::fill_n(block.red + at, count, channel(16));
    std::fill_n(block.green + at, count, channel(8));
    std::fill_n(block.blue + at, count, channel(0));
    std::fill_n(block.alpha + at, count, hasAlpha ? channel(24) : 1.0f);
}

// Moves a channel by a share of its distance to white or to black. Damage never goes beyond them.
void Lighten(float& channel, float share) noexcept {
    channel += share * std::max(1.0f - channel, 0.0f);
}
void Darken(float& channel, float share) noexcept {
    channel -= share * std::max(channel, 0.0f);
}

bool IsStreamable(const DeepFrame& frame) noexcept {
    constexpr std::uintptr_t kBytes = 16;
    return frame.format.PixelBytes() == std::ptrdiff_t{kBytes} &&
           reinterpret_cast<std::uintptr_t>(frame.destination.pixels) % kBytes == 0 &&
           static_cast<std::uintptr_t>(frame.destination.rowStep) % kBytes == 0;
}

// Of four floats, in a line of the caches. Streamed blocks end at the end of a line, so that none is written in parts.
std::int32_t PixelsIntoLine(const std::uint8_t* pixels) noexcept {
    return static_cast<std::int32_t>(reinterpret_cast<std::uintptr_t>(pixels) % 64 / 16);
}

template <typename Change>
void ChangePixel(DeepBlock& block, std::int32_t x, Change&& change) noexcept {
    change(block.red[x]);
    change(block.green[x]);
    change(block.blue[x]);
}

}  // namespace

DeepSource::Part DeepSource::PartOf(std::int32_t y, std::int32_t from, std::int32_t count) const noexcept {
    const std::int32_t row = y - m_jitter.Dy(), shift = m_jitter.Dx();
    if (row < 0 || row >= m_frame.height) return {count, count, nullptr};
    const std::int32_t first = std::clamp(shift - from, 0, count);
    const std::int32_t end = std::clamp(m_frame.width + shift - from, first, count);
    return {first, end, m_picture.Row(row) + (from + first - shift) * m_frame.format.PixelBytes()};
}

void DeepSource::Read(std::int32_t y, std::int32_t from, std::int32_t count,
                      DeepBlock& block) const noexcept {
    block.isInside = true;
    const DeepFormat& format = m_frame.format;
    const auto [first, end, pixels] = PartOf(y, from, count);
    if (first != end) {
        m_kernels.load[SamplesOf(format)][ChannelsOf(format)](pixels, block, first, end - first);
        if (format.isPremultiplied) m_kernels.divide(block, first, end - first);
    }
    // After the load, which may write a vector's rest.
    FillBorder(block, 0, first, m_jitter.Border(), format.channels == 4);
    FillBorder(block, end, count - end, m_jitter.Border(), format.channels == 4);
}

// From place `at` of the block on.
void DeepSource::SumPixels(std::int32_t y, std::int32_t from, std::int32_t count, DeepBlock& block,
                           std::int32_t at) const noexcept {
    if (count <= 0) return;
    DeepBlock read;
    Read(y, from, count, read);
    const std::int32_t sums = (count + 3) / 4;
    const auto sum = [&](float* channel, float* out) {
        std::fill(channel + count, channel + 4 * sums, channel[count - 1]);
        m_kernels.glow.sixteenths(channel, out + at, sums);
    };
    sum(read.red, block.red);
    sum(read.green, block.green);
    sum(read.blue, block.blue);
}

// From the left, since each part may write a vector's rest.
void DeepSource::ReadSixteenths(std::int32_t y, std::int32_t from, std::int32_t count,
                                DeepBlock& block) const noexcept {
    const DeepFormat& format = m_frame.format;
    const Part part = PartOf(y, from, count);
    const std::int32_t first = (part.first + 3) / 4, sums = part.end / 4 - first;
    if (format.channels != 4 || format.isPremultiplied || sums <= 0)
        return SumPixels(y, from, count, block, 0);
    SumPixels(y, from, 4 * first, block, 0);
    const std::uint8_t* const pixels = part.pixels + (4 * first - part.first) * format.PixelBytes();
    if (!m_kernels.loadSixteenths[SamplesOf(format)](pixels, block, first, sums))
        SumPixels(y, from + 4 * first, 4 * sums, block, first);
    const std::int32_t done = 4 * (first + sums);
    SumPixels(y, from + done, count - done, block, first + sums);
}

DeepRowProgram::DeepRowProgram(const DeepFrame& frame, const FramePlan& plan, DeepGlow& glow,
                               const DeepKernels& kernels, bool streams) noexcept
    : m_frame(frame),
      m_plan(plan),
      m_glow(glow),
      m_kernels(kernels),
      m_streams(streams && IsStreamable(frame)),
      m_tone(DeepToneOf(plan.colour, plan.tint)) {
    ForEachStage(plan, [this](const auto& stage) { Add(stage); });
}

void DeepRowProgram::Add(const GlowStage&) noexcept {
    if (m_glow.IsActive()) m_steps[m_count++] = {&DeepRowProgram::BeginGlow, &DeepRowProgram::RunGlow};
}

void DeepRowProgram::AddTone() noexcept {
    if (m_hasTone || !m_tone.IsActive()) return;
    m_hasTone = true;
    m_steps[m_count++] = {&DeepRowProgram::BeginNothing, &DeepRowProgram::RunTone};
}

void DeepRowProgram::Add(const WearStage& stage) noexcept {
    if (stage.IsActive()) m_steps[m_count++] = {&DeepRowProgram::BeginWear, &DeepRowProgram::RunWear};
}

void DeepRowProgram::Add(const ScratchStage& stage) noexcept {
    if (stage.IsActive())
        m_steps[m_count++] = {&DeepRowProgram::BeginScratches, &DeepRowProgram::RunScratches};
}

void DeepRowProgram::Add(const SpotStage& stage) noexcept {
    if (stage.IsActive()) m_steps[m_count++] = {&DeepRowProgram::BeginNothing, &DeepRowProgram::RunSpots};
}

void DeepRowProgram::Run(const DeepSource& source, std::int32_t y) const noexcept {
    const DeepFormat& format = m_frame.format;
    Row row;
    row.y = y;
    for (std::size_t i = 0; i < m_count; ++i) (this->*m_steps[i].begin)(row);
    for (row.from = m_frame.window.left; row.from < m_frame.window.right; row.from += row.count) {
        std::uint8_t* const pixels = m_frame.destination.Row(y) + row.from * format.PixelBytes();
        const std::int32_t most = m_streams ? kDeepBlock - PixelsIntoLine(pixels) : kDeepBlock;
        row.count = std::min(most, m_frame.window.right - row.from);
        source.Read(y, row.from, row.count, row.block);
        for (std::size_t i = 0; i < m_count; ++i) (this->*m_steps[i].run)(row);
        if (format.isPremultiplied) m_kernels.multiply(row.block, 0, row.count);
        if (m_streams) {
            m_kernels.stream(row.block, pixels, row.count);
        } else {
            m_kernels.store[SamplesOf(format)][ChannelsOf(format)](row.block, 0, pixels, row.count);
        }
    }
}

void DeepRowProgram::BeginWear(Row& row) const noexcept {
    const GreyPicture& picture = m_plan.wear.Picture();
    row.strips = m_plan.wear.RowsOver(row.y);
    for (std::int32_t start = 0; start <= m_frame.window.left; start += picture.width) {
        row.wear = picture.pixels + row.strips.Next() * picture.rowStep;
        row.wearLeft = start + picture.width - m_frame.window.left;
    }
    row.wear += picture.width - row.wearLeft;
}

void DeepRowProgram::RunWear(Row& row) const noexcept {
    const WearStage& stage = m_plan.wear;
    const GreyPicture& picture = stage.Picture();
    for (std::int32_t x = 0; x < row.count;) {
        if (row.wearLeft == 0) {
            row.wear = picture.pixels + row.strips.Next() * picture.rowStep;
            row.wearLeft = picture.width;
        }
        const std::int32_t count = std::min(row.wearLeft, row.count - x);
        std::memcpy(row.wearBytes + x, row.wear, static_cast<std::size_t>(count));
        row.wear += count;
        row.wearLeft -= count;
        x += count;
    }
    m_kernels.wear(row.block, row.wearBytes, row.count, stage.Amount(), stage.BlueOnly());
}

void DeepRowProgram::BeginScratches(Row& row) const noexcept {
    const ScratchRowPlace place = m_plan.scratches.PlaceOf(row.y);
    std::size_t i = 0;
    for (const ScratchLine& line : m_plan.scratches.Lines()) {
        if (!FindSpan(line, place, row.spans[i])) row.spans[i].weights = nullptr;
        ++i;
    }
}

void DeepRowProgram::RunScratches(Row& row) const noexcept {
    std::size_t next = 0;
    for (const ScratchLine& line : m_plan.scratches.Lines()) {
        const ScratchSpan& span = row.spans[next++];
        if (span.weights == nullptr) continue;
        const std::int32_t start = std::max(span.first - row.from, 0);
        const std::int32_t skipped = row.from + start - span.first;
        const std::int32_t count = std::min(line.pixels - skipped, row.count - start);
        if (count <= 0) continue;
        float shares[kMostScratchPixels + DeepBlock::kPad] = {};
        const float strength = static_cast<float>(span.strength) * (1.0f / 4294967296.0f);
        for (std::int32_t i = 0; i < count; ++i)
            shares[i] = static_cast<float>(span.weights[skipped + i]) * strength;
        const float towards = static_cast<float>(line.isWhite ? kBrightest : kDarkest) / 255.0f;
        m_kernels.scratch(row.block.red + start, shares, count, towards, line.isWhite);
        m_kernels.scratch(row.block.green + start, shares, count, towards, line.isWhite);
        m_kernels.scratch(row.block.blue + start, shares, count, towards, line.isWhite);
    }
}

void DeepRowProgram::RunSpots(Row& row) const noexcept {
    for (std::uint32_t i = 0; i < m_plan.spots.Count(); ++i) {
        const PlacedSpot& spot = m_plan.spots.Spot(i);
        const std::int32_t line = row.y - spot.top;
        if (line < 0 || line >= spot.height) continue;
        const std::uint8_t key = spot.picture->pixels[0];
        const std::int32_t start = spot.left - row.from;
        const std::int32_t end = std::min(start + spot.width, row.count);
        for (std::int32_t x = std::max(start, 0); x < end; ++x) {
            const float fraction = SpotFraction(spot.ByteAt(line, x - start), key, spot.strength);
            ChangePixel(row.block, x, [&](float& channel) {
                fraction > 0.0f ? Lighten(channel, fraction) : Darken(channel, -fraction);
            });
        }
    }
}

}  // namespace velmora::render

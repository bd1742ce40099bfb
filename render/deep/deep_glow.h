// Glow (render/glow.h) for deep pictures: the same blurs with the same weights, in floating point. The layer has no
// dither, since nothing is rounded. Light above white spreads in proportion, but no part of the layer gets brighter
// than full glow.
#pragma once

#include <cstdint>

#include "render/deep/deep_kernels.h"
#include "render/growing_memory.h"

namespace velmora::render {

// Rows of cells, three channels after each other in each row, with padding at both ends of each channel.
struct DeepCells {
    static constexpr std::int32_t kPad = 48;  // kernels read and write whole vectors

    float* base = nullptr;
    std::int32_t width = 0;
    std::int32_t height = 0;

    [[nodiscard]] std::ptrdiff_t ChannelStep() const noexcept {
        constexpr std::ptrdiff_t kLine = 16;  // of the caches, in numbers
        return (std::ptrdiff_t{width} + kLine - 1) / kLine * kLine + 2 * kPad;
    }
    [[nodiscard]] std::uint64_t Size() const noexcept {
        return static_cast<std::uint64_t>(ChannelStep()) * 3 * static_cast<std::uint64_t>(height);
    }
    // `y` is clamped to the rows.
    [[nodiscard]] float* Row(std::int32_t y, int channel) const noexcept {
        const std::int32_t clamped = y < 0 ? 0 : y < height ? y : height - 1;
        return base + ChannelStep() * (std::ptrdiff_t{clamped} * 3 + channel) + kPad;
    }
};

// Reads blocks of the picture that the glow starts from.
class DeepBlockReader {
  public:
    // Pixels `from` .. `from` + `count` of row `y`, at the start of the block.
    virtual void Read(std::int32_t y, std::int32_t from, std::int32_t count,
                      DeepBlock& block) const noexcept = 0;
    // Of the same pixels, a sixteenth of the sum of each four. After the last pixel of a row it repeats.
    virtual void ReadSixteenths(std::int32_t y, std::int32_t from, std::int32_t count,
                                DeepBlock& block) const noexcept = 0;

  protected:
    ~DeepBlockReader() = default;
};

class DeepGlow {
  public:
    DeepGlow() noexcept = default;
    // See GlowStage. `rows` has two scratch rows; the first holds the layer over the current row.
    DeepGlow(const DeepCells& layer, int reduction, const DeepCells& rows,
             const DeepGlowKernels& kernels) noexcept
        : m_layer(layer), m_rows(rows), m_reduction(reduction), m_kernels(&kernels) {}

    [[nodiscard]] bool IsActive() const noexcept { return m_kernels != nullptr; }
    // Prepares row `y` of the frame. Rows are worked on one at a time.
    void BeginRow(std::int32_t width, std::int32_t y) noexcept;
    // Screens the row's pixels from column `from` on, the first `count` of the block.
    void Screen(DeepBlock& block, std::int32_t from, std::int32_t count) const noexcept;

  private:
    DeepCells m_layer;
    DeepCells m_rows;
    int m_reduction = 0;
    int m_row = 0;  // of the scratch rows that holds the layer
    const DeepGlowKernels* m_kernels = nullptr;
};

// Makes the layer of a picture for an amount in 0..1; inactive if there is nothing to do or not enough memory. It points
// into `memory` and is valid until the memory is used again.
[[nodiscard]] DeepGlow PrepareDeepGlow(float amount, const DeepBlockReader& input, std::int32_t width,
                                       std::int32_t height, GrowingMemory<float>& memory,
                                       const DeepGlowKernels& kernels) noexcept;

}  // namespace velmora::render

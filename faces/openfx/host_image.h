// A picture of one of the host's clips.
#pragma once

#include <cstddef>
#include <cstdint>

#include "faces/openfx/host.h"

namespace velmora::hosts::openfx {

enum class Depth : std::uint8_t { kByte, kShort, kFloat };

// Bytes of a sample.
[[nodiscard]] constexpr int SampleBytes(Depth depth) noexcept {
    return depth == Depth::kByte ? 1 : depth == Depth::kShort ? 2 : 4;
}

// Pixels of red, green, blue and perhaps alpha, or of alpha alone. y counts upwards; the image covers `bounds` of the
// clip's `region`. Rows may lie at any address, their samples need not be aligned. Given back in the destructor.
class HostImage {
  public:
    // Throws ActionFailed, with kOfxStatErrImageFormat for an image that cannot be. `clip` lives longer than the image.
    HostImage(const Suites& suites, OfxImageClipHandle clip, OfxTime time);
    ~HostImage();
    HostImage(const HostImage&) = delete;
    HostImage& operator=(const HostImage&) = delete;

    // False when the clip has no image at that time. It then counts as black and transparent, and its bounds are empty.
    [[nodiscard]] bool IsThere() const noexcept { return m_handle != nullptr; }
    [[nodiscard]] const OfxRectI& Bounds() const noexcept { return m_bounds; }
    [[nodiscard]] const OfxRectI& Region() const noexcept { return m_region; }
    [[nodiscard]] openfx::Depth Depth() const noexcept { return m_depth; }
    [[nodiscard]] int Channels() const noexcept { return m_channels; }  // 4: RGBA, 3: RGB, 1: alpha
    [[nodiscard]] bool IsPremultiplied() const noexcept { return m_isPremultiplied; }
    [[nodiscard]] bool Holds(int x, int y) const noexcept {
        return x >= m_bounds.x1 && x < m_bounds.x2 && y >= m_bounds.y1 && y < m_bounds.y2;
    }
    // Within the bounds.
    [[nodiscard]] std::byte* Pixel(int x, int y) const noexcept {
        return m_data + std::ptrdiff_t{m_rowBytes} * (y - m_bounds.y1) +
               std::ptrdiff_t{x - m_bounds.x1} * m_channels * SampleBytes(m_depth);
    }

  private:
    void Read(const Properties& image);
    void Check() const;

    const Suites& m_suites;
    OfxPropertySetHandle m_handle = nullptr;
    OfxRectI m_bounds{}, m_region{};
    openfx::Depth m_depth = openfx::Depth::kByte;
    int m_channels = 0;
    bool m_isPremultiplied = false;
    int m_rowBytes = 0;
    std::byte* m_data = nullptr;  // of the row y1
};

}  // namespace velmora::hosts::openfx

// A picture for tests of single stages: rows without gaps.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

#include "render/image.h"

namespace velmora::testing {

class PlainPicture final : public render::RowReader {
  public:
    PlainPicture(std::int32_t width, std::int32_t height, render::Bgra pixel = {})
        : m_width(width),
          m_height(height),
          m_pixels(static_cast<std::size_t>(width) * static_cast<std::size_t>(height), pixel) {}

    static PlainPicture Random(std::int32_t width, std::int32_t height, std::uint32_t seed) {
        PlainPicture picture(width, height);
        std::mt19937 numbers(seed);
        const auto byte = [&numbers] { return static_cast<std::uint8_t>(numbers()); };
        for (render::Bgra& pixel : picture.m_pixels) pixel = {byte(), byte(), byte(), byte()};
        return picture;
    }

    [[nodiscard]] std::int32_t Width() const { return m_width; }
    [[nodiscard]] std::int32_t Height() const { return m_height; }
    [[nodiscard]] std::vector<render::Bgra>& Pixels() { return m_pixels; }
    [[nodiscard]] const std::vector<render::Bgra>& Pixels() const { return m_pixels; }
    [[nodiscard]] render::Bgra* Row(std::int32_t y) {
        return m_pixels.data() + static_cast<std::ptrdiff_t>(m_width) * y;
    }
    [[nodiscard]] const render::Bgra* Row(std::int32_t y) const {
        return m_pixels.data() + static_cast<std::ptrdiff_t>(m_width) * y;
    }
    [[nodiscard]] render::ShiftedRow RowAt(std::int32_t y) const noexcept override {
        return {Row(y), 0, m_width, 0};
    }

    [[nodiscard]] render::FrameDescription Description() {
        return {m_pixels.data(), m_width, m_height, m_width * 4, 0, 0};
    }

  private:
    std::int32_t m_width;
    std::int32_t m_height;
    std::vector<render::Bgra> m_pixels;
};

inline bool SamePixels(const PlainPicture& a, const PlainPicture& b) {
    return std::memcmp(a.Pixels().data(), b.Pixels().data(), a.Pixels().size() * sizeof(render::Bgra)) == 0;
}

}  // namespace velmora::testing

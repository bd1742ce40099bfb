// A picture in memory in the layout of the effects: rows of blue, green, red and alpha bytes from the top.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "api/host_api.h"

namespace velmora::hosts {

class BgraPicture {
  public:
    BgraPicture() = default;
    BgraPicture(std::int32_t width, std::int32_t height) { Resize(width, height); }

    void Resize(std::int32_t width, std::int32_t height) {
        m_width = width;
        m_height = height;
        // Vector code of the converters reads and writes past a row's end.
        m_stride = (static_cast<std::ptrdiff_t>(width) * 4 + 63) / 64 * 64 + 64;
        m_bytes.resize(static_cast<std::size_t>(m_stride) * static_cast<std::size_t>(height) + 64);
    }

    [[nodiscard]] std::int32_t Width() const { return m_width; }
    [[nodiscard]] std::int32_t Height() const { return m_height; }
    [[nodiscard]] std::ptrdiff_t Stride() const { return m_stride; }  // bytes
    [[nodiscard]] std::uint8_t* Row(std::int32_t y) { return m_bytes.data() + y * m_stride; }
    [[nodiscard]] const std::uint8_t* Row(std::int32_t y) const { return m_bytes.data() + y * m_stride; }

    // The record for calling effects; valid until the picture is resized.
    FrameRecord Record() {
        return {m_bytes.data(), m_width, m_height, static_cast<std::int32_t>(m_stride), 0, 0, 0};
    }

  private:
    std::int32_t m_width = 0, m_height = 0;
    std::ptrdiff_t m_stride = 0;
    std::vector<std::uint8_t> m_bytes;
};

}  // namespace velmora::hosts

// Frames for tests: any geometry, guard bytes all round, random or given pixels.
#pragma once

#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

#include "api/host_api.h"
#include "render/image.h"

namespace velmora::testing {

struct Geometry {
    std::int32_t width = 8;
    std::int32_t height = 6;
    std::int32_t xOrigin = 0;
    std::int32_t yOrigin = 0;
    std::int32_t padding = 0;  // bytes after each row
    bool bottomUp = false;
};

class GuardedFrame {
  public:
    static constexpr std::size_t kGuardBytes = 64;
    static constexpr std::uint8_t kGuard = 0xA5;

    explicit GuardedFrame(const Geometry& geometry) : m_geometry(geometry) {
        m_step = (geometry.xOrigin + geometry.width) * 4 + geometry.padding;
        const std::int32_t rows = geometry.yOrigin + geometry.height;
        m_bytes.assign(static_cast<std::size_t>(m_step) * static_cast<std::size_t>(rows) + 2 * kGuardBytes,
                       kGuard);
    }

    // Fills the whole buffer, origin and padding included.
    void FillRandom(std::uint32_t seed) {
        std::mt19937 numbers(seed);
        for (std::size_t i = kGuardBytes; i < m_bytes.size() - kGuardBytes; ++i) {
            m_bytes[i] = static_cast<std::uint8_t>(numbers());
        }
    }

    [[nodiscard]] render::Bgra At(std::int32_t row, std::int32_t column) const {
        render::Bgra pixel;
        std::memcpy(&pixel, m_bytes.data() + Offset(row, column), sizeof pixel);
        return pixel;
    }
    [[nodiscard]] std::uint32_t WordAt(std::int32_t row, std::int32_t column) const {
        std::uint32_t word;
        std::memcpy(&word, m_bytes.data() + Offset(row, column), sizeof word);
        return word;
    }
    void Set(std::int32_t row, std::int32_t column, render::Bgra pixel) {
        std::memcpy(m_bytes.data() + Offset(row, column), &pixel, sizeof pixel);
    }

    // As a host would pass it: the region described by the geometry.
    [[nodiscard]] FrameRecord Record() {
        const std::int32_t rows = m_geometry.yOrigin + m_geometry.height;
        std::uint8_t* lowest = m_bytes.data() + kGuardBytes;
        FrameRecord record = {};
        record.pixels = m_geometry.bottomUp ? lowest + std::ptrdiff_t{m_step} * (rows - 1) : lowest;
        record.width = m_geometry.width;
        record.height = m_geometry.height;
        record.rowStep = m_geometry.bottomUp ? -m_step : m_step;
        record.xOrigin = m_geometry.xOrigin;
        record.yOrigin = m_geometry.yOrigin;
        return record;
    }
    [[nodiscard]] render::FrameDescription Description() {
        const FrameRecord r = Record();
        return {r.pixels, r.width, r.height, r.rowStep, r.xOrigin, r.yOrigin};
    }

    [[nodiscard]] const std::vector<std::uint8_t>& Bytes() const { return m_bytes; }
    [[nodiscard]] const Geometry& Shape() const { return m_geometry; }

    // Whether all bytes outside the top left width x height pixels of the region equal those of `before`.
    [[nodiscard]] bool OnlyRegionDiffers(const GuardedFrame& before, std::int32_t width,
                                         std::int32_t height) const {
        for (std::size_t i = 0; i < m_bytes.size(); ++i) {
            if (m_bytes[i] != before.m_bytes[i] && !IsInside(i, width, height)) return false;
        }
        return true;
    }

  private:
    // Rows count from the lowest address, also for bottom-up frames.
    [[nodiscard]] std::size_t Offset(std::int32_t row, std::int32_t column) const {
        return kGuardBytes +
               static_cast<std::size_t>(m_geometry.yOrigin + row) * static_cast<std::size_t>(m_step) +
               static_cast<std::size_t>(m_geometry.xOrigin + column) * 4;
    }
    [[nodiscard]] bool IsInside(std::size_t offset, std::int32_t width, std::int32_t height) const {
        for (std::int32_t row = 0; row < height; ++row) {
            if (offset >= Offset(row, 0) && offset < Offset(row, width)) return true;
        }
        return false;
    }

    Geometry m_geometry;
    std::int32_t m_step = 0;
    std::vector<std::uint8_t> m_bytes;
};

}  // namespace velmora::testing

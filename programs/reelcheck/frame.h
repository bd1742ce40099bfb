// Pictures as hosts pass them, in guarded memory: the buffer's last byte is the last pixel's.
#pragma once

#include <cstdint>

#include "programs/reelcheck/check.h"
#include "programs/reelcheck/system.h"
#include "api/host_api.h"

namespace velmora::reelcheck {

struct Layout {
    std::int32_t width = 1;  // of the region, in pixels
    std::int32_t height = 1;
    std::int32_t xOrigin = 0;
    std::int32_t yOrigin = 0;
    std::int32_t padding = 0;  // bytes after each row but the last
    bool bottomUp = false;
    Edge edge = Edge::kBack;
};

// How a row's bytes follow from its width.
enum class Packing { kBgra, kYcbcr };

class Frame {
  public:
    explicit Frame(const Layout& layout, Packing packing = Packing::kBgra);

    // Fills the whole buffer: a picture with edges, gradients, noise, and black, white and fully opaque pixels.
    void Paint(Dice& dice) const;
    void Fill(std::uint8_t value) const;
    // For a source: a write then ends the process.
    void ForbidWriting() noexcept { m_memory.ForbidWriting(); }

    [[nodiscard]] FrameRecord Record() const noexcept;
    // A frame of another shape in the same memory, `offset` bytes in.
    [[nodiscard]] FrameRecord RecordAt(std::int32_t offset, const Layout& layout) const noexcept;
    [[nodiscard]] const Layout& Shape() const noexcept { return m_layout; }
    [[nodiscard]] std::int32_t Step() const noexcept { return m_step; }
    [[nodiscard]] std::uint8_t* Bytes() const noexcept { return m_memory.Data(); }
    [[nodiscard]] std::size_t Size() const noexcept { return m_memory.Size(); }

    // A digest of the picture in the top left width x height pixels of the region.
    [[nodiscard]] std::uint64_t Digest(std::int32_t width, std::int32_t height) const noexcept;
    [[nodiscard]] std::uint64_t Digest() const noexcept { return Digest(m_layout.width, m_layout.height); }
    // After Fill(value): whether everything outside those pixels still has that value.
    [[nodiscard]] bool OnlyInside(std::int32_t width, std::int32_t height, std::uint8_t value) const noexcept;
    // Copies another frame's region of the same size.
    void CopyRegion(const Frame& from) noexcept;

  private:
    [[nodiscard]] std::size_t RowBytes(std::int32_t width) const noexcept;
    [[nodiscard]] std::uint8_t* Row(
        std::int32_t row) const noexcept;  // of the region, from the lowest address

    Layout m_layout;
    Packing m_packing;
    std::int32_t m_step;
    GuardedMemory m_memory;
};

}  // namespace velmora::reelcheck

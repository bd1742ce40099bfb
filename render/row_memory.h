// A scratch row of pixels between the stages and the frame.
#pragma once

#include <cstdint>
#include <memory>

#include "render/image.h"

namespace velmora::render {

class RowMemory {
  public:
    // `width` >= 0 uninitialised pixels, aligned to a cache line, or null if there is not enough memory. Invalidates
    // the previous row.
    [[nodiscard]] Bgra* Reserve(std::int32_t width) noexcept;

  private:
    std::unique_ptr<std::uint8_t[]> m_bytes;
    std::size_t m_size = 0;
};

}  // namespace velmora::render

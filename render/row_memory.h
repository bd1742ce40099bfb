// Room for one row of pixels between the stages and the frame.
#pragma once

#include <cstdint>
#include <memory>

#include "render/image.h"

namespace velmora::render {

class RowMemory {
  public:
    // `width` >= 0 pixels of undefined value that start a cache line, or null when there is no memory. Ends what
    // was there.
    [[nodiscard]] Bgra* Reserve(std::int32_t width) noexcept;

  private:
    std::unique_ptr<std::uint8_t[]> m_bytes;
    std::size_t m_size = 0;
};

}  // namespace velmora::render

// What deep rendering keeps from frame to frame, so that frames of one size allocate once.
#pragma once

#include <cstddef>
#include <cstdint>
#include <limits>
#include <memory>
#include <new>

namespace velmora::render {

template <typename Number>
class DeepBuffer {
  public:
    // At least `count` uninitialised numbers, or null if there is not enough memory. Invalidates the previous ones.
    [[nodiscard]] Number* Reserve(std::uint64_t count) noexcept {
        if (count > std::numeric_limits<std::ptrdiff_t>::max() / sizeof(Number)) return nullptr;
        if (count > m_size) {
            m_numbers.reset();
            m_numbers.reset(new (std::nothrow) Number[static_cast<std::size_t>(count)]);
            m_size = m_numbers != nullptr ? count : 0;
        }
        return m_numbers.get();
    }

  private:
    std::unique_ptr<Number[]> m_numbers;
    std::uint64_t m_size = 0;
};

using DeepGlowMemory = DeepBuffer<float>;

struct DeepMemory {
    DeepGlowMemory glow;
    DeepBuffer<std::uint8_t> copy;  // of the source, for frames rendered in place
};

}  // namespace velmora::render

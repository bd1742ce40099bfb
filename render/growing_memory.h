// Memory that rendering keeps from frame to frame, so that frames of one size allocate once.
#pragma once

#include <cstddef>
#include <cstdint>
#include <limits>
#include <memory>
#include <new>
#include <type_traits>

namespace velmora::render {

template <typename Number>
class GrowingMemory {
    static_assert(std::is_trivially_copyable_v<Number>);

  public:
    // At least `count` uninitialised numbers, aligned to a cache line, or null if there is not enough memory.
    // Invalidates the previous ones.
    [[nodiscard]] Number* Reserve(std::uint64_t count) noexcept {
        constexpr std::size_t kMost = std::numeric_limits<std::ptrdiff_t>::max() - kLine;
        if (count > kMost / sizeof(Number)) return nullptr;
        const std::size_t wanted = static_cast<std::size_t>(count) * sizeof(Number) + kLine - 1;
        if (wanted > m_size) {
            // The old memory goes first: together they might not fit.
            m_bytes.reset();
            m_bytes.reset(new (std::nothrow) std::uint8_t[wanted]);
            m_size = m_bytes != nullptr ? wanted : 0;
        }
        return Data();
    }
    // What was reserved last; null when that failed, and before the first time.
    [[nodiscard]] Number* Data() const noexcept {
        if (m_bytes == nullptr) return nullptr;
        const std::uintptr_t past = reinterpret_cast<std::uintptr_t>(m_bytes.get()) % kLine;
        return reinterpret_cast<Number*>(m_bytes.get() + (past == 0 ? 0 : kLine - past));
    }

  private:
    static constexpr std::size_t kLine = 64;

    std::unique_ptr<std::uint8_t[]> m_bytes;
    std::size_t m_size = 0;
};

}  // namespace velmora::render

#include "render/row_memory.h"

#include <cstddef>
#include <limits>
#include <new>

namespace velmora::render {

Bgra* RowMemory::Reserve(std::int32_t width) noexcept {
    constexpr std::size_t kLine = 64;
    const std::uint64_t wanted = static_cast<std::uint64_t>(width) * sizeof(Bgra) + kLine - 1;
    if (wanted > static_cast<std::size_t>(std::numeric_limits<std::ptrdiff_t>::max())) return nullptr;
    if (wanted > m_size) {
        m_bytes.reset();
        m_bytes.reset(new (std::nothrow) std::uint8_t[static_cast<std::size_t>(wanted)]);
        m_size = m_bytes != nullptr ? static_cast<std::size_t>(wanted) : 0;
        if (m_bytes == nullptr) return nullptr;
    }
    const std::uintptr_t past = reinterpret_cast<std::uintptr_t>(m_bytes.get()) % kLine;
    return reinterpret_cast<Bgra*>(m_bytes.get() + (past == 0 ? 0 : kLine - past));
}

}  // namespace velmora::render

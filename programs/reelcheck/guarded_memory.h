// Memory between two pages that nobody may touch: one byte too far ends the process, which is reported.
#pragma once

#include <cstddef>
#include <cstdint>

namespace velmora::reelcheck {

// The side on which the memory ends exactly at its forbidden page; on the other side lies the rest of a page.
enum class Edge { kFront, kBack };

class GuardedMemory {
  public:
    // Filled with zeros. Throws std::bad_alloc.
    GuardedMemory(std::size_t size, Edge edge);
    ~GuardedMemory();
    GuardedMemory(const GuardedMemory&) = delete;
    GuardedMemory& operator=(const GuardedMemory&) = delete;

    [[nodiscard]] std::uint8_t* Data() const noexcept { return m_data; }
    [[nodiscard]] std::size_t Size() const noexcept { return m_size; }
    // From now on a write ends the process as well.
    void ForbidWriting() noexcept;

  private:
    std::uint8_t* m_pages = nullptr;  // the first forbidden one
    std::size_t m_inner = 0;          // bytes between the two
    std::uint8_t* m_data = nullptr;
    std::size_t m_size;
};

}  // namespace velmora::reelcheck

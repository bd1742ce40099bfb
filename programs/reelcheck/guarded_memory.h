// Memory between two inaccessible pages: an access one byte out of bounds ends the process, which is reported.
#pragma once

#include <cstddef>
#include <cstdint>

namespace velmora::reelcheck {

// The side on which the memory ends exactly at its guard page; on the other side the rest of a page follows.
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
    // From now on a write ends the process too.
    void ForbidWriting() noexcept;

  private:
    std::uint8_t* m_pages = nullptr;  // the first guard page
    std::size_t m_inner = 0;          // bytes between the guard pages
    std::uint8_t* m_data = nullptr;
    std::size_t m_size;
};

}  // namespace velmora::reelcheck

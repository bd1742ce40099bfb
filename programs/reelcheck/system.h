// What the checks use of the system for their own process: memory that no access may leave, and figures that must not
// grow. One implementation a system: system_posix.cpp, system_win32.cpp.
#pragma once

#include <cstddef>
#include <cstdint>

namespace velmora::reelcheck {

// The side on which the memory ends exactly at its guard page; on the other side the rest of a page follows.
enum class Edge { kFront, kBack };

// Memory between two inaccessible pages: an access one byte out of bounds ends the process, which is reported.
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

// The system resources that this process holds.
struct ProcessFigures {
    std::int64_t handles = 0;      // natively: open files
    std::int64_t modules = 0;      // natively: mapped files
    std::int64_t memoryBytes = 0;  // committed for this process alone
    std::int64_t threads = 0;
    std::int64_t windowObjects = 0;   // Windows: windows, menus, hooks
    std::int64_t threadSlots = 0;     // Windows: slots of thread-local storage
    std::int64_t drawingObjects = 0;  // Windows: bitmaps, fonts, device contexts
};

[[nodiscard]] ProcessFigures FiguresNow();

// Fails when any figure of `after` exceeds that of `before`; memory may differ by `memorySlack` bytes (check.cpp).
void RequireNoGrowth(const ProcessFigures& before, const ProcessFigures& after, std::int64_t memorySlack);

}  // namespace velmora::reelcheck

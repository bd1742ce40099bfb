// Tracks the library's allocations and can make them fail.
//
// During a watch's lifetime every allocation of the library is counted, blocks that it has not freed are recorded,
// and one chosen allocation fails as if memory had run out. Natively the library's allocations cannot be
// distinguished from this program's, so a watch may only cover calls into the library.
#pragma once

#include <cstdint>

namespace velmora::reelcheck {

// Once per process, before the library is loaded. On Windows it replaces entries of the C library for modules that
// are loaded later.
void InstallAllocationHooks();

class AllocationWatch {
  public:
    // `failing`: which allocation fails, counted from 1; 0 for none.
    explicit AllocationWatch(std::uint64_t failing = 0) noexcept;
    ~AllocationWatch();
    AllocationWatch(const AllocationWatch&) = delete;
    AllocationWatch& operator=(const AllocationWatch&) = delete;

    // Allocations requested.
    [[nodiscard]] std::uint64_t Count() const noexcept;
    [[nodiscard]] bool HasFailed() const noexcept { return m_failing != 0 && Count() >= m_failing; }

  private:
    std::uint64_t m_failing;
};

// Blocks that the library allocated during any watch and has not freed.
[[nodiscard]] std::uint64_t LiveBlocks() noexcept;

namespace ledger {

// For the hooks. True when the allocation now requested must fail.
[[nodiscard]] bool IsWatching() noexcept;
[[nodiscard]] bool Refuses() noexcept;
// `heap`: any tag shared by blocks that belong together; may be null.
void Add(void* block, const void* heap = nullptr) noexcept;
void Remove(void* block) noexcept;
void RemoveHeap(const void* heap) noexcept;

}  // namespace ledger

}  // namespace velmora::reelcheck

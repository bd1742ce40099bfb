// Sees what the library allocates, and can refuse it.
//
// While a watch lives, every allocation of the library is counted, blocks that it has not given back are known, and one
// allocation of choice fails as if memory were short. Natively the library's allocations cannot be told from this
// program's: there, only calls into the library may stand in a watch's life.
#pragma once

#include <cstdint>

namespace velmora::reelcheck {

// Once in a process, before the library is loaded. On Windows it shows modules that are loaded later other entries of
// the C library.
void InstallAllocationHooks();

class AllocationWatch {
  public:
    // `failing`: which allocation fails, from 1; 0: none.
    explicit AllocationWatch(std::uint64_t failing = 0) noexcept;
    ~AllocationWatch();
    AllocationWatch(const AllocationWatch&) = delete;
    AllocationWatch& operator=(const AllocationWatch&) = delete;

    // Allocations that were asked for.
    [[nodiscard]] std::uint64_t Count() const noexcept;
    [[nodiscard]] bool HasFailed() const noexcept { return m_failing != 0 && Count() >= m_failing; }

  private:
    std::uint64_t m_failing;
};

// Blocks that the library allocated during any watch and has not given back.
[[nodiscard]] std::uint64_t LiveBlocks() noexcept;

namespace ledger {

// For the hooks. True when an allocation that is asked for now is to be refused.
[[nodiscard]] bool IsWatching() noexcept;
[[nodiscard]] bool Refuses() noexcept;
// `heap`: any mark for the blocks that go together; may be null.
void Add(void* block, const void* heap = nullptr) noexcept;
void Remove(void* block) noexcept;
void RemoveHeap(const void* heap) noexcept;

}  // namespace ledger

}  // namespace velmora::reelcheck

// Natively the library allocates with the operators that this program replaces for the whole process.

#include <cstdlib>
#include <new>

#include "programs/reelcheck/allocation_ledger.h"

namespace velmora::reelcheck {
namespace {

void* Allocate(std::size_t size) noexcept {
    if (ledger::Refuses()) return nullptr;
    void* const block = std::malloc(size != 0 ? size : 1);
    ledger::Add(block);
    return block;
}

void* AllocateOrThrow(std::size_t size) {
    void* const block = Allocate(size);
    if (block == nullptr) throw std::bad_alloc();
    return block;
}

void Free(void* block) noexcept {
    ledger::Remove(block);
    std::free(block);
}

}  // namespace

void InstallAllocationHooks() {}

}  // namespace velmora::reelcheck

// clang-format off
void* operator new(std::size_t size) { return velmora::reelcheck::AllocateOrThrow(size); }
void* operator new[](std::size_t size) { return velmora::reelcheck::AllocateOrThrow(size); }
void* operator new(std::size_t size, const std::nothrow_t&) noexcept { return velmora::reelcheck::Allocate(size); }
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept { return velmora::reelcheck::Allocate(size); }
void operator delete(void* block) noexcept { velmora::reelcheck::Free(block); }
void operator delete[](void* block) noexcept { velmora::reelcheck::Free(block); }
void operator delete(void* block, std::size_t) noexcept { velmora::reelcheck::Free(block); }
void operator delete[](void* block, std::size_t) noexcept { velmora::reelcheck::Free(block); }
void operator delete(void* block, const std::nothrow_t&) noexcept { velmora::reelcheck::Free(block); }
void operator delete[](void* block, const std::nothrow_t&) noexcept { velmora::reelcheck::Free(block); }
// clang-format on

#include "programs/reelcheck/allocation_ledger.h"

#include <atomic>
#include <cstddef>

namespace velmora::reelcheck {
namespace {

// A set of addresses that itself allocates nothing: open addressing, with tombstones for removed entries.
class AddressSet {
  public:
    void Add(void* block, const void* heap) noexcept {
        for (std::size_t at = Start(block);; at = (at + 1) % kCapacity) {
            if (m_places[at] == block) return;
            if (m_places[at] == nullptr || m_places[at] == Removed()) {
                m_places[at] = block;
                m_heaps[at] = heap;
                ++m_count;
                return;
            }
            if (m_count == kCapacity) return;
        }
    }
    void Remove(void* block) noexcept {
        std::size_t at = Start(block);
        for (std::size_t i = 0; i < kCapacity && m_places[at] != nullptr; ++i, at = (at + 1) % kCapacity) {
            if (m_places[at] != block) continue;
            // The last entry of a run needs no tombstone.
            m_places[at] = m_places[(at + 1) % kCapacity] == nullptr ? nullptr : Removed();
            --m_count;
            return;
        }
    }
    void RemoveHeap(const void* heap) noexcept {
        for (std::size_t at = 0; at < kCapacity; ++at) {
            if (m_places[at] == nullptr || m_places[at] == Removed() || m_heaps[at] != heap) continue;
            m_places[at] = Removed();
            --m_count;
        }
    }
    [[nodiscard]] std::uint64_t Count() const noexcept { return m_count; }

  private:
    static constexpr std::size_t kCapacity = 1 << 18;
    static void* Removed() noexcept { return reinterpret_cast<void*>(1); }
    static std::size_t Start(const void* block) noexcept {
        return static_cast<std::size_t>(reinterpret_cast<std::uintptr_t>(block) >> 3) * 2654435761u %
               kCapacity;
    }

    void* m_places[kCapacity];
    const void* m_heaps[kCapacity];
    std::uint64_t m_count;
};

AddressSet g_live;
std::atomic_flag g_lock = ATOMIC_FLAG_INIT;
std::atomic<bool> g_isWatching{false};
std::atomic<std::uint64_t> g_count{0}, g_failing{0};

class Locked {
  public:
    Locked() noexcept {
        while (g_lock.test_and_set(std::memory_order_acquire)) {
        }
    }
    ~Locked() { g_lock.clear(std::memory_order_release); }
    Locked(const Locked&) = delete;
    Locked& operator=(const Locked&) = delete;
};

}  // namespace

AllocationWatch::AllocationWatch(std::uint64_t failing) noexcept : m_failing(failing) {
    g_count = 0;
    g_failing = failing;
    g_isWatching = true;
}

AllocationWatch::~AllocationWatch() {
    g_isWatching = false;
}

std::uint64_t AllocationWatch::Count() const noexcept {
    return g_count;
}

std::uint64_t LiveBlocks() noexcept {
    const Locked lock;
    return g_live.Count();
}

namespace ledger {

bool IsWatching() noexcept {
    return g_isWatching;
}

bool Refuses() noexcept {
    return g_isWatching && ++g_count == g_failing;
}

void Add(void* block, const void* heap) noexcept {
    if (block == nullptr || !g_isWatching) return;
    const Locked lock;
    g_live.Add(block, heap);
}

void Remove(void* block) noexcept {
    if (block == nullptr) return;
    const Locked lock;
    g_live.Remove(block);
}

void RemoveHeap(const void* heap) noexcept {
    const Locked lock;
    g_live.RemoveHeap(heap);
}

}  // namespace ledger
}  // namespace velmora::reelcheck

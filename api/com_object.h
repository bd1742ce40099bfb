// What all reference-counted objects of the library have in common.
#pragma once

#include <atomic>
#include <cstdint>
#include <cstring>

#include "api/host_api.h"

namespace velmora {

[[nodiscard]] inline bool SameId(const Guid* a, const Guid& b) noexcept {
    return a != nullptr && std::memcmp(a, &b, sizeof(Guid)) == 0;
}

// An interface of an object, with its identifier.
struct Interface {
    const Guid* iid;
    void* pointer;
};

// The first interface whose identifier matches; null when none does.
template <std::size_t kCount>
[[nodiscard]] void* InterfaceOf(const Interface (&interfaces)[kCount], const Guid* iid) noexcept {
    for (const Interface& entry : interfaces) {
        if (SameId(iid, *entry.iid)) return entry.pointer;
    }
    return nullptr;
}

// Stores that interface, or null. Adds no reference: the caller does, if the result is kStatusOk.
template <std::size_t kCount>
[[nodiscard]] Status FindInterface(const Interface (&interfaces)[kCount], const Guid* iid,
                                   void** out) noexcept {
    if (out == nullptr) return kStatusFailure;
    *out = InterfaceOf(interfaces, iid);
    return *out != nullptr ? kStatusOk : kStatusNoInterface;
}

// A reference count that starts with the creator's reference.
class ReferenceCount {
  public:
    std::uint32_t Add() noexcept { return static_cast<std::uint32_t>(m_count.fetch_add(1) + 1); }
    // Returns the remaining count; at 0 the caller must destroy the object.
    std::uint32_t Drop() noexcept { return static_cast<std::uint32_t>(m_count.fetch_sub(1) - 1); }

  private:
    std::atomic<std::int32_t> m_count{1};
};

}  // namespace velmora

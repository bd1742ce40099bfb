// Holds one reference to a reference-counted object and releases it, so that nobody calls Release by hand.
//
// There are two named ways to create one, because a pointer does not show which is right: Adopt for a pointer that came
// with a reference (from a function that creates objects, or QueryInterface), Share for one that is only borrowed (an
// argument).
#pragma once

#include <utility>

#include "api/host_api.h"

namespace velmora {

template <class Interface>
class Reference {
  public:
    Reference() noexcept = default;
    // Takes over the reference that the caller owns. Null gives an empty holder, here and below.
    [[nodiscard]] static Reference Adopt(Interface* object) noexcept { return Reference(object); }
    // Adds a reference of its own.
    [[nodiscard]] static Reference Share(Interface* object) noexcept {
        if (object != nullptr) object->AddRef();
        return Reference(object);
    }

    Reference(const Reference& other) noexcept : Reference(Share(other.m_object)) {}
    Reference(Reference&& other) noexcept : m_object(std::exchange(other.m_object, nullptr)) {}
    Reference& operator=(Reference other) noexcept {
        std::swap(m_object, other.m_object);
        return *this;
    }
    ~Reference() { Reset(); }

    // Releases the reference now.
    void Reset() noexcept {
        if (Interface* const object = std::exchange(m_object, nullptr)) object->Release();
    }

    [[nodiscard]] Interface* Get() const noexcept { return m_object; }
    [[nodiscard]] Interface* operator->() const noexcept { return m_object; }
    [[nodiscard]] Interface& operator*() const noexcept { return *m_object; }
    [[nodiscard]] explicit operator bool() const noexcept { return m_object != nullptr; }
    [[nodiscard]] bool operator==(const Reference&) const noexcept = default;  // the same object

  private:
    explicit Reference(Interface* object) noexcept : m_object(object) {}

    Interface* m_object = nullptr;
};

// The interface `iid` of `object`; empty when it has none.
template <class Interface>
[[nodiscard]] Reference<Interface> QueryFor(com::IUnknown& object, const Guid& iid) noexcept {
    void* found = nullptr;
    if (object.QueryInterface(&iid, &found) != kStatusOk) return {};
    return Reference<Interface>::Adopt(static_cast<Interface*>(found));
}

}  // namespace velmora

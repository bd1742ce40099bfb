// The host as a plug-in sees it: its suites, its property sets and its memory. Everything here belongs to the host; the
// classes only refer to it.
#pragma once

#include <cstddef>
#include <optional>
#include <string_view>

#include "faces/openfx/ofx_api.h"

namespace velmora::hosts::openfx {

// Ends an action with a status. Caught at the plug-in's entry.
struct ActionFailed {
    OfxStatus status;
};

inline void Require(OfxStatus status) {
    if (status != kOfxStatOK) throw ActionFailed{status};
}

struct Suites {
    const OfxPropertySuiteV1* property = nullptr;
    const OfxImageEffectSuiteV1* effect = nullptr;
    const OfxParameterSuiteV1* parameter = nullptr;
    const OfxMemorySuiteV1* memory = nullptr;  // null: the host offers none
};

// Throws ActionFailed (kOfxStatErrMissingHostFeature) when the host, a suite or one of its functions is missing.
[[nodiscard]] Suites FetchSuites(const OfxHost* host);

// One of the host's property sets. The getters return nothing, and the optional setters do nothing, when the host does
// not know the property; the required ones throw ActionFailed.
class Properties {
  public:
    Properties(const Suites& suites, OfxPropertySetHandle handle) noexcept
        : m_suite(suites.property), m_handle(handle) {}

    void Set(const char* name, const char* value, int index = 0) const;
    void Set(const char* name, double value, int index = 0) const;
    void Set(const char* name, int value, int index = 0) const;
    void Set(const char* name, const OfxRectD& value) const;
    void SetPointer(const char* name, void* value) const;
    // For properties that not every host has.
    template <typename Value>
    void Offer(const char* name, Value value, int index = 0) const noexcept {
        TrySet(name, value, index);
    }

    [[nodiscard]] std::optional<int> Int(const char* name, int index = 0) const noexcept;
    [[nodiscard]] std::optional<double> Double(const char* name, int index = 0) const noexcept;
    // Empty for a text that is not there.
    [[nodiscard]] std::string_view Text(const char* name) const noexcept;
    [[nodiscard]] void* Pointer(const char* name) const noexcept;
    [[nodiscard]] std::optional<OfxRectI> Rectangle(const char* name) const noexcept;

  private:
    OfxStatus TrySet(const char* name, const char* value, int index) const noexcept;
    OfxStatus TrySet(const char* name, double value, int index) const noexcept;
    OfxStatus TrySet(const char* name, int value, int index) const noexcept;

    const OfxPropertySuiteV1* m_suite;
    OfxPropertySetHandle m_handle;
};

// A block of the host's memory, or of our own when the host offers none. Throws std::bad_alloc.
class HostMemory {
  public:
    HostMemory(const Suites& suites, OfxImageEffectHandle effect, std::size_t bytes);
    ~HostMemory();
    HostMemory(const HostMemory&) = delete;
    HostMemory& operator=(const HostMemory&) = delete;

    [[nodiscard]] void* Data() const noexcept { return m_data; }

  private:
    const OfxMemorySuiteV1* m_suite;
    void* m_data = nullptr;
};

}  // namespace velmora::hosts::openfx

// The process-wide shell services and how library objects use them: each live one can supply translated texts.
#pragma once

#include <algorithm>
#include <cstddef>
#include <new>
#include <vector>

#include "api/host_api.h"
#include "platform/platform.h"

namespace velmora::support {

// Valid as long as the process, or the library, is loaded.
[[nodiscard]] IShellServices& ShellServices() noexcept;

// Call when a library object is created: offers it as a source of translated texts, without taking a reference, and
// starts the services if they are not running.
void OfferTextSource(ModuleHandle module, com::IUnknown* library, const char* helpFileName) noexcept;

// Call when a library object is destroyed: from then on another live one, if any, supplies texts. With the last one the
// services shut down, so that the library can be unloaded; the next library object starts them again.
void WithdrawTextSource(com::IUnknown* library) noexcept;

// Counts the library objects and remembers them without taking references: each removes itself before it is destroyed.
class TextSources {
  public:
    void Add(com::IUnknown* library) noexcept {
        ++m_count;
        try {
            m_sources.push_back(library);
        } catch (const std::bad_alloc&) {
            // The library still counts, but is never asked for texts.
        }
    }
    void Remove(com::IUnknown* library) noexcept {
        if (m_count > 0) --m_count;
        std::erase(m_sources, library);
        if (m_count == 0) m_sources = {};  // leave nothing allocated in a module about to be unloaded
    }
    // The oldest live library object, null when there is none.
    [[nodiscard]] com::IUnknown* Current() const noexcept {
        return m_sources.empty() ? nullptr : m_sources.front();
    }
    [[nodiscard]] std::size_t Count() const noexcept { return m_count; }

  private:
    std::vector<com::IUnknown*> m_sources;
    std::size_t m_count = 0;
};

}  // namespace velmora::support

// The live library objects, each of which can supply translated texts.
#pragma once

#include <algorithm>
#include <cstddef>
#include <new>
#include <vector>

#include "api/host_api.h"

namespace velmora::support {

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

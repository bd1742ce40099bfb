// The library as a host has it: on Windows loaded from its file and used through its exports alone, natively linked
// into this program.
#pragma once

#include <memory>
#include <string>

#include "api/reference.h"

namespace velmora::reelcheck {

// Loaded once: unloads when it goes. Everything that came out of it must be released before.
class Library {
  public:
    // An empty path means the library beside this program. Throws CheckFailed when it cannot be loaded.
    explicit Library(const std::string& path);
    ~Library();
    Library(const Library&) = delete;
    Library& operator=(const Library&) = delete;

    // For a load that may fail: no library then, and nothing is thrown.
    [[nodiscard]] static std::unique_ptr<Library> TryLoad(const std::string& path);

    GetEffectsLibraryFunction getEffectsLibrary = nullptr;
    CanUnloadDLLNowFunction canUnload = nullptr;

    // A library object. Throws CheckFailed when there is none.
    [[nodiscard]] Reference<IEffectLibrary> Open() const;

  private:
    explicit Library(void* module) noexcept;

    void* m_module = nullptr;
};

// Loading and unloading is a matter of modules only where the library is one.
[[nodiscard]] bool IsModule() noexcept;

// A library object of a loaded library, for the checks that need no more.
class OpenLibrary {
  public:
    explicit OpenLibrary(const std::string& path) : m_library(path), m_object(m_library.Open()) {}

    IEffectLibrary* operator->() const noexcept { return m_object.Get(); }
    [[nodiscard]] IEffectLibrary* Get() const noexcept { return m_object.Get(); }
    // Lets the library object go; what it created may stay.
    void Close() noexcept { m_object.Reset(); }
    // Throws CheckFailed when there is none.
    [[nodiscard]] Reference<IVideoEffect> Effect(std::uint32_t index) const;
    [[nodiscard]] Reference<IFrameProcessor> Processor() const;
    [[nodiscard]] Reference<IPresetSaver> Saver() const;

  private:
    Library m_library;
    Reference<IEffectLibrary> m_object;
};

}  // namespace velmora::reelcheck

// The library as a host uses it: on Windows loaded from its file and called through its exports alone, natively
// linked into this program.
#pragma once

#include <memory>
#include <string>

#include "api/reference.h"

namespace velmora::reelcheck {

// Unloads the library in the destructor. Everything obtained from it must be released first.
class Library {
  public:
    // An empty path means the library next to this program. Throws CheckFailed when it cannot be loaded.
    explicit Library(const std::string& path);
    ~Library();
    Library(const Library&) = delete;
    Library& operator=(const Library&) = delete;

    // For a load that may fail: returns null instead of throwing.
    [[nodiscard]] static std::unique_ptr<Library> TryLoad(const std::string& path);

    GetEffectsLibraryFunction getEffectsLibrary = nullptr;
    CanUnloadDLLNowFunction canUnload = nullptr;

    // A library object. Throws CheckFailed when there is none.
    [[nodiscard]] Reference<IEffectLibrary> Open() const;

  private:
    explicit Library(void* module) noexcept;

    void* m_module = nullptr;
};

// Whether the library is a module, which can be loaded and unloaded.
[[nodiscard]] bool IsModule() noexcept;

// A library object of a loaded library, for checks that need nothing else.
class OpenLibrary {
  public:
    explicit OpenLibrary(const std::string& path) : m_library(path), m_object(m_library.Open()) {}

    IEffectLibrary* operator->() const noexcept { return m_object.Get(); }
    [[nodiscard]] IEffectLibrary* Get() const noexcept { return m_object.Get(); }
    // Releases the library object; objects it created may stay.
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

// The library as a host uses it: on Windows loaded from its file and called through its exports alone, natively
// linked into this program.
#pragma once

#include <memory>
#include <string>

#include "api/reference.h"
#include "programs/reelcheck/check.h"

namespace velmora::reelcheck {

// Takes over the reference to an object that the library gave out. Throws CheckFailed when it gave none.
template <typename Interface>
Reference<Interface> Given(Interface* object, const char* what) {
    if (object == nullptr) Fail(std::string("the library gives no ") + what);
    return Reference<Interface>::Adopt(object);
}

// Unloads the library in the destructor. Everything obtained from it must be released first.
class Library {
  public:
    // An empty path means the library next to this program. Throws CheckFailed when it cannot be loaded.
    explicit Library(const std::string& path);
    ~Library();  // NOLINT(performance-trivially-destructible): not trivial on Windows
    Library(const Library&) = delete;
    Library& operator=(const Library&) = delete;

    // For a load that may fail: returns null instead of throwing.
    [[nodiscard]] static std::unique_ptr<Library> TryLoad(const std::string& path);

    GetEffectsLibraryFunction getEffectsLibrary = nullptr;
    CanUnloadDLLNowFunction canUnload = nullptr;

    // A library object. Throws CheckFailed when there is none.
    [[nodiscard]] Reference<IEffectLibrary> Open() const {
        return Given(getEffectsLibrary(), "library object");
    }

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
    [[nodiscard]] Reference<IVideoEffect> Effect(std::uint32_t index) const {
        return Given(m_object->CreateEffect(index), "effect");
    }
    [[nodiscard]] Reference<IFrameProcessor> Processor() const {
        return Given(m_object->CreateFrameProcessor(), "frame processor");
    }
    [[nodiscard]] Reference<IPresetSaver> Saver() const {
        return Given(m_object->CreatePresetSaver(), "preset saver");
    }

  private:
    Library m_library;
    Reference<IEffectLibrary> m_object;
};

}  // namespace velmora::reelcheck

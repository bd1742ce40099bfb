#include <windows.h>

#include "programs/common/effect_library.h"
#include "programs/reelcheck/check.h"
#include "programs/reelcheck/library.h"

namespace velmora::reelcheck {
namespace {

void* Load(const std::string& path) {
    void* const module = LoadLibraryW(hosts::LibraryFile(path).c_str());
    if (module == nullptr) Fail(Text("the library cannot be loaded, system error %lu", GetLastError()));
    return module;
}

template <typename Function>
Function Export(void* module, const char* name) {
    return reinterpret_cast<Function>(
        reinterpret_cast<void*>(GetProcAddress(static_cast<HMODULE>(module), name)));
}

}  // namespace

Library::Library(void* module) noexcept
    : getEffectsLibrary(Export<GetEffectsLibraryFunction>(module, "GetEffectsLibrary")),
      canUnload(Export<CanUnloadDLLNowFunction>(module, "CanUnloadDLLNow")),
      m_module(module) {}

Library::Library(const std::string& path) : Library(Load(path)) {
    if (getEffectsLibrary == nullptr || canUnload == nullptr) Fail("an export is missing");
}

Library::~Library() {
    if (m_module != nullptr) FreeLibrary(static_cast<HMODULE>(m_module));
}

std::unique_ptr<Library> Library::TryLoad(const std::string& path) {
    const std::wstring file = hosts::LibraryFile(path);
    void* const module = LoadLibraryW(file.c_str());
    if (module == nullptr) return nullptr;
    return std::unique_ptr<Library>(new Library(module));
}

bool IsModule() noexcept {
    return true;
}

}  // namespace velmora::reelcheck

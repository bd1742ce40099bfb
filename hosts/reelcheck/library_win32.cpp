#include <windows.h>

#include "hosts/reelcheck/check.h"
#include "hosts/reelcheck/library.h"

namespace velmora::reelcheck {
namespace {

constexpr wchar_t kFileName[] = L"VMReelEffects.dll";

std::wstring BesideThisProgram() {
    std::wstring path(32768, L'\0');
    path.resize(GetModuleFileNameW(nullptr, path.data(), static_cast<DWORD>(path.size())));
    return path.substr(0, path.find_last_of(L"\\/") + 1) + kFileName;
}

std::wstring PathOf(const std::string& path) {
    if (path.empty()) return BesideThisProgram();
    std::wstring wide(path.size(), L'\0');
    const int length = MultiByteToWideChar(CP_ACP, 0, path.data(), static_cast<int>(path.size()), wide.data(),
                                           static_cast<int>(wide.size()));
    wide.resize(static_cast<std::size_t>(length));
    return wide;
}

void* Load(const std::string& path) {
    void* const module = LoadLibraryW(PathOf(path).c_str());
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
    const std::wstring file = PathOf(path);
    void* const module = LoadLibraryW(file.c_str());
    if (module == nullptr) return nullptr;
    return std::unique_ptr<Library>(new Library(module));
}

bool IsModule() noexcept {
    return true;
}

}  // namespace velmora::reelcheck

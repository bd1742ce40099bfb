#include <windows.h>

#include "programs/common/library_file.h"
#include "text/code_page.h"

namespace velmora::hosts {
namespace {

constexpr wchar_t kFileName[] = L"VMReelEffects.dll";

std::wstring BesideThisProgram() {
    std::wstring path(32768, L'\0');
    path.resize(GetModuleFileNameW(nullptr, path.data(), static_cast<DWORD>(path.size())));
    return path.substr(0, path.find_last_of(L"\\/") + 1) + kFileName;
}

}  // namespace

std::wstring LibraryFile(const std::wstring& path) {
    return path.empty() ? BesideThisProgram() : path;
}

std::wstring LibraryFile(const std::string& path) {
    if (path.empty()) return BesideThisProgram();
    const std::u16string wide = Widen(path);
    return {wide.begin(), wide.end()};
}

}  // namespace velmora::hosts

#include <windows.h>

#include "programs/common/library_file.h"

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
    std::wstring wide(path.size(), L'\0');
    const int length = MultiByteToWideChar(CP_ACP, 0, path.data(), static_cast<int>(path.size()), wide.data(),
                                           static_cast<int>(wide.size()));
    wide.resize(static_cast<std::size_t>(length));
    return wide;
}

}  // namespace velmora::hosts

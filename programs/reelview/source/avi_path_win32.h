// Paths for the system's AVI interface, which predates 16-bit file names. Windows only.
#pragma once

#include <windows.h>

#include <string>

namespace velmora::reelview {

// The path of an existing file in the system's code page; its short path if the code page lacks a character.
inline std::wstring AviPath(const std::wstring& file) {
    BOOL isReplaced = FALSE;
    const int length = static_cast<int>(file.size());
    const DWORD flags = GetACP() == CP_UTF8 ? 0 : WC_NO_BEST_FIT_CHARS;
    WideCharToMultiByte(CP_ACP, flags, file.c_str(), length, nullptr, 0, nullptr,
                        GetACP() == CP_UTF8 ? nullptr : &isReplaced);
    if (!isReplaced) return file;
    std::wstring shortPath(MAX_PATH, L'\0');
    shortPath.resize(GetShortPathNameW(file.c_str(), shortPath.data(), MAX_PATH));
    return shortPath.empty() || shortPath.size() >= MAX_PATH ? file : shortPath;
}

}  // namespace velmora::reelview

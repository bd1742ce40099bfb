// Opens any file that the system can read. Windows only; COM must be initialised on the thread.
#pragma once

#include <windows.h>

#include <memory>
#include <string>
#include <vector>

#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {

struct ClipRequest {
    std::vector<std::wstring> files;  // more than one: a sequence of pictures
    bool isSequence = false;          // the first file belongs to a numbered sequence
};

// Throws SourceError, or std::bad_alloc when there is not enough memory.
[[nodiscard]] std::unique_ptr<ClipSource> OpenClip(const ClipRequest& request);

// AVI files through the system's AVI interface. Throws SourceError when the file is not an AVI file or no installed codec decodes it.
[[nodiscard]] std::unique_ptr<ClipSource> OpenAviClip(const std::wstring& file);

// Films through the system's Media Foundation source reader, where there is one: MP4, MOV, WMV from Windows 7 on.
// Throws SourceError.
[[nodiscard]] std::unique_ptr<ClipSource> OpenMediaClip(const std::wstring& file);

// Pictures through the Windows Imaging Component: PNG, JPEG, BMP, TIFF and any other format that the system reads. Throws SourceError.
[[nodiscard]] Picture ReadPicture(const std::wstring& file);
// Throws SourceError (text::kCannotWrite).
void WritePng(const std::wstring& file, const Picture& picture);

// One picture, or a sequence of pictures of the same size. Throws SourceError.
[[nodiscard]] std::unique_ptr<ClipSource> OpenPictures(std::vector<std::wstring> files);
// A picture and the files in its folder that continue its numbering.
[[nodiscard]] std::unique_ptr<ClipSource> OpenSequence(const std::wstring& file);

// For the system's AVI interface, which predates 16-bit file names: the path of an existing file in the system's code
// page, or its short path if the code page lacks a character.
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

#include "programs/reelview/window/file_dialogs_win32.h"

#include <commdlg.h>

#include <array>

#include "programs/reelview/base/text_keys.h"

namespace velmora::reelview {
namespace {

constexpr DWORD kLongestPath = 32768;

// "label (patterns)", then the patterns, each terminated by a zero.
void AddFilter(std::wstring& filter, const std::wstring& label, const std::wstring& patterns) {
    filter += label + L" (" + patterns + L')';
    filter += L'\0';
    filter += patterns;
    filter += L'\0';
}

struct Asked {
    std::wstring file;
    DWORD filterIndex;
};

std::optional<Asked> Ask(HWND owner, const std::wstring& filter, const wchar_t* extension, bool isSaving) {
    std::wstring file(kLongestPath, L'\0');
    OPENFILENAMEW dialog = {};
    dialog.lStructSize = sizeof dialog;
    dialog.hwndOwner = owner;
    dialog.lpstrFilter = filter.c_str();
    dialog.nFilterIndex = 1;
    dialog.lpstrFile = file.data();
    dialog.nMaxFile = kLongestPath;
    dialog.lpstrDefExt = extension;
    dialog.Flags = OFN_EXPLORER | OFN_HIDEREADONLY | OFN_NOCHANGEDIR | OFN_PATHMUSTEXIST |
                   (isSaving ? OFN_OVERWRITEPROMPT : OFN_FILEMUSTEXIST);
    const BOOL isChosen = isSaving ? GetSaveFileNameW(&dialog) : GetOpenFileNameW(&dialog);
    if (!isChosen) return std::nullopt;
    return Asked{file.c_str(), dialog.nFilterIndex};
}

bool HasExtension(const std::wstring& file, const std::wstring& extension) {
    return file.size() > extension.size() &&
           lstrcmpiW(file.c_str() + file.size() - extension.size(), extension.c_str()) == 0;
}

}  // namespace

std::optional<std::wstring> AskOpenFile(HWND owner, const Texts& texts) {
    std::wstring filter;
    AddFilter(filter, texts(text::kAllKinds),
              L"*.png;*.jpg;*.jpeg;*.bmp;*.tif;*.tiff;*.gif;*.y4m;*.avi;*.mp4;*.m4v;*.mov;*.wmv");
    AddFilter(filter, texts(text::kAllFiles), L"*.*");
    const auto asked = Ask(owner, filter, nullptr, false);
    if (!asked) return std::nullopt;
    return asked->file;
}

std::optional<std::wstring> AskPngFile(HWND owner, const Texts& texts) {
    std::wstring filter;
    AddFilter(filter, texts(text::kPngPicture), L"*.png");
    const auto asked = Ask(owner, filter, L"png", true);
    if (!asked) return std::nullopt;
    return asked->file;
}

// The selected type counts, but a file name with another type's extension is just as clear.
std::optional<ClipChoice> AskClipFile(HWND owner, const Texts& texts) {
    struct Row {
        const char* label;
        const wchar_t* extension;
        ClipKind kind;
    };
    static constexpr std::array kRows = {
        Row{text::kAviPlain, L".avi", ClipKind::kAviPlain},
        Row{text::kAviCodec, L".avi", ClipKind::kAviCodec},
        Row{text::kPngSequence, L".png", ClipKind::kPngSequence},
        Row{text::kY4mFilm, L".y4m", ClipKind::kY4m},
    };
    std::wstring filter;
    for (const Row& row : kRows) AddFilter(filter, texts(row.label), std::wstring(L"*") + row.extension);
    // A default extension makes the dialog add that of the selected type.
    const auto asked = Ask(owner, filter, L"avi", true);
    if (!asked) return std::nullopt;
    const std::size_t index =
        asked->filterIndex >= 1 && asked->filterIndex <= kRows.size() ? asked->filterIndex - 1 : 0;
    if (HasExtension(asked->file, kRows[index].extension)) return ClipChoice{asked->file, kRows[index].kind};
    for (const Row& row : kRows) {
        if (HasExtension(asked->file, row.extension)) return ClipChoice{asked->file, row.kind};
    }
    return ClipChoice{asked->file + kRows[index].extension, kRows[index].kind};
}

}  // namespace velmora::reelview

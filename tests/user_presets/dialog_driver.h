// Reads and answers the system's dialogs from a second thread, like a user.
#pragma once

#include <gtest/gtest.h>

#include <windows.h>
#include <commdlg.h>
#include <dlgs.h>

#include <string>

namespace velmora::tests {

inline std::wstring TextOf(HWND window) {
    wchar_t text[2048] = L"";
    SendMessageW(window, WM_GETTEXT, std::size(text), reinterpret_cast<LPARAM>(text));
    return text;
}

inline HWND FileTypes(HWND dialog) {
    return GetDlgItem(dialog, cmb1);
}

// A file dialog or a message of this process; null when none appears within some seconds. They are told apart by
// their content, because a new window may reuse the handle of one that has just closed.
inline HWND WaitForWindow(bool isFileDialog) {
    for (int tries = 0; tries < 400; ++tries) {
        HWND window = nullptr;
        while ((window = FindWindowExW(nullptr, window, L"#32770", nullptr)) != nullptr) {
            DWORD process = 0;
            GetWindowThreadProcessId(window, &process);
            const bool isReady = IsWindowVisible(window) && IsWindowEnabled(window);
            const bool isFitting = (FileTypes(window) != nullptr) == isFileDialog;
            if (process == GetCurrentProcessId() && isReady && isFitting) return window;
        }
        Sleep(25);
    }
    return nullptr;
}
inline HWND WaitForFileDialog() {
    return WaitForWindow(true);
}
inline HWND WaitForMessage() {
    return WaitForWindow(false);
}

inline void Press(HWND dialog, int button) {
    PostMessageW(dialog, WM_COMMAND, MAKEWPARAM(button, BN_CLICKED), 0);
}

inline bool WaitForEnd(HWND window) {
    for (int tries = 0; tries < 400 && IsWindow(window); ++tries) Sleep(25);
    return !IsWindow(window);
}

// The contents of a file dialog. The file type list shows the label; its pattern decides which files are listed.
struct SeenFileDialog {
    std::wstring title, label;
    int labels = 0;
};

// The name field is an edit control, alone or inside a combo box.
inline HWND NameField(HWND dialog) {
    HWND field = GetDlgItem(dialog, edt1);
    if (field == nullptr) field = GetDlgItem(dialog, cmb13);
    return field;
}

inline SeenFileDialog See(HWND dialog) {
    SeenFileDialog seen = {TextOf(dialog), TextOf(FileTypes(dialog)), 0};
    seen.labels = static_cast<int>(SendMessageW(FileTypes(dialog), CB_GETCOUNT, 0, 0));
    return seen;
}

inline void Type(HWND dialog, const std::string& fileName) {
    const std::wstring wide(fileName.begin(), fileName.end());
    SendMessageW(NameField(dialog), WM_SETTEXT, 0, reinterpret_cast<LPARAM>(wide.c_str()));
}

// Waits for a file dialog, reads it, and answers it with a name, or cancels it when there is none.
inline HWND AnswerFileDialog(const std::string& fileName, SeenFileDialog* seen) {
    HWND dialog = WaitForFileDialog();
    if (dialog == nullptr) {
        ADD_FAILURE() << "no file dialog";
        return nullptr;
    }
    Sleep(300);  // until it has filled its controls
    *seen = See(dialog);
    if (!fileName.empty()) Type(dialog, fileName);
    Press(dialog, fileName.empty() ? IDCANCEL : IDOK);
    return dialog;
}

struct SeenMessage {
    std::wstring caption, text;
    int buttons = 0;
    bool hasOk = false;
    bool hasExclamation = false;
};

inline SeenMessage SeeMessage(HWND box) {
    SeenMessage seen;
    seen.caption = TextOf(box);
    HWND child = nullptr;
    while ((child = FindWindowExW(box, child, nullptr, nullptr)) != nullptr) {
        wchar_t name[64] = L"";
        GetClassNameW(child, name, std::size(name));
        const auto icon = reinterpret_cast<HICON>(SendMessageW(child, STM_GETICON, 0, 0));
        if (std::wstring(name) == L"Button" && IsWindowVisible(child)) {
            ++seen.buttons;
            const int id = GetDlgCtrlID(child);
            seen.hasOk = seen.hasOk || id == IDOK || (id == IDCANCEL && TextOf(child) == L"OK");
        } else if (icon != nullptr) {
            seen.hasExclamation = icon == LoadIconW(nullptr, IDI_EXCLAMATION);
        } else if (std::wstring(name) == L"Static" && !TextOf(child).empty()) {
            seen.text = TextOf(child);
        }
    }
    return seen;
}

}  // namespace velmora::tests

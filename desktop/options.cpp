#include "desktop/options.h"

#include <shellapi.h>
#include <windowsx.h>

#include <algorithm>
#include <cstdio>
#include <cstring>

#include "help/topics.h"
#include "desktop/bit_button.h"
#include "desktop/resource_ids.h"
#include "platform/win32.h"

namespace velmora::support {
namespace {

constexpr char kSection[] = "Common";
constexpr char kKnobsSetting[] = "Knobs Drag Vertical";
constexpr DWORD kLongestText = 1024;  // bytes, with the terminator

std::string KeyPath(const char* section) {
    return std::string("Software\\Velmora\\") + section;
}

std::optional<std::string> ReadText(HKEY root, const std::string& path, const char* name) {
    HKEY opened = nullptr;
    if (RegOpenKeyExA(root, path.c_str(), 0, KEY_READ, &opened) != ERROR_SUCCESS) return {};
    const win32::RegistryKey key(opened);
    char text[kLongestText + 1] = {};  // one extra: a stored text need not be terminated
    DWORD type = REG_NONE;
    DWORD size = kLongestText;
    const LSTATUS status =
        RegQueryValueExA(key.get(), name, nullptr, &type, reinterpret_cast<BYTE*>(text), &size);
    if (status != ERROR_SUCCESS || type != REG_SZ) return {};
    return std::string(text);
}

constexpr wchar_t kWebPage[] = L"https://www.velmora.example/reel-effects";  // the maker's page

constexpr RECT kLogoPlace = {10, 8, 230, 40};  // in dialog units

// Centres the dialog over its owner, inside the screen's work area. Without an owner the system has already centred it.
void CentreOverOwner(HWND window) noexcept {
    const HWND owner = GetWindow(window, GW_OWNER);
    RECT over = {};
    RECT own = {};
    MONITORINFO monitor = {};
    monitor.cbSize = sizeof monitor;
    if (owner == nullptr || IsIconic(owner) || !GetWindowRect(owner, &over) || !GetWindowRect(window, &own) ||
        !GetMonitorInfoW(MonitorFromWindow(owner, MONITOR_DEFAULTTONEAREST), &monitor)) {
        return;
    }
    const auto placed = [](LONG from, LONG to, LONG size, LONG lowest, LONG highest) {
        const LONG centred = from + (to - from - size) / 2;
        return static_cast<int>(std::max(lowest, std::min(centred, highest - size)));
    };
    const RECT& area = monitor.rcWork;
    SetWindowPos(window, nullptr, placed(over.left, over.right, own.right - own.left, area.left, area.right),
                 placed(over.top, over.bottom, own.bottom - own.top, area.top, area.bottom), 0, 0,
                 SWP_NOSIZE | SWP_NOZORDER | SWP_NOACTIVATE);
}

void OpenWebPage(HWND owner) noexcept {
    SHELLEXECUTEINFOW execution = {};
    execution.cbSize = sizeof execution;
    execution.fMask = SEE_MASK_FLAG_NO_UI;
    execution.hwnd = owner;
    execution.lpVerb = L"open";
    execution.lpFile = kWebPage;
    execution.nShow = SW_SHOWNORMAL;
    ShellExecuteExW(&execution);
}

}  // namespace

void Preferences::Read() noexcept try {
    const std::optional<std::string> knobs = ReadSetting(kSection, kKnobsSetting);
    m_knobsDragVertical = knobs && knobs->starts_with('y');
} catch (...) {
    m_knobsDragVertical = false;  // not enough memory
}

void Preferences::SetKnobsDragVertical(bool vertical) noexcept try {
    m_knobsDragVertical = vertical;
    WriteSetting(kSection, kKnobsSetting, vertical ? "yes" : "no");
} catch (...) {
    // Not enough memory: treated as if the registry had refused.
}

std::optional<std::string> ReadSetting(const char* section, const char* name) {
    const std::string path = KeyPath(section);
    std::optional<std::string> text = ReadText(HKEY_CURRENT_USER, path, name);
    return text ? text : ReadText(HKEY_LOCAL_MACHINE, path, name);
}

bool WriteSetting(const char* section, const char* name, const char* text) {
    HKEY opened = nullptr;
    if (RegCreateKeyExA(HKEY_CURRENT_USER, KeyPath(section).c_str(), 0, nullptr, REG_OPTION_NON_VOLATILE,
                        KEY_ALL_ACCESS, nullptr, &opened, nullptr) != ERROR_SUCCESS) {
        return false;
    }
    const win32::RegistryKey key(opened);
    return RegSetValueExA(key.get(), name, 0, REG_SZ, reinterpret_cast<const BYTE*>(text),
                          static_cast<DWORD>(std::strlen(text) + 1)) == ERROR_SUCCESS;
}

bool OptionsDialog::Show(HWND owner) noexcept {
    const win32::ManifestScope manifest(m_parts.templates);
    const INT_PTR result =
        DialogBoxParamW(m_parts.templates, MAKEINTRESOURCEW(VM_DIALOG_OPTIONS),
                        IsWindow(owner) ? owner : nullptr, Procedure, reinterpret_cast<LPARAM>(this));
    return result == IDOK;
}

void OptionsDialog::ToFront() const noexcept {
    if (m_window != nullptr) SetForegroundWindow(m_window);
}

void OptionsDialog::Abandon() noexcept {
    if (m_logo != nullptr) DestroyWindow(m_logo);
    m_logo = nullptr;
    if (m_window != nullptr) EndDialog(m_window, 0);
}

INT_PTR CALLBACK OptionsDialog::Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept {
    if (message == WM_INITDIALOG) {
        SetWindowLongPtrW(window, DWLP_USER, lParam);
        auto* opened = reinterpret_cast<OptionsDialog*>(lParam);
        opened->m_window = window;
        opened->OnOpen();
        return TRUE;  // the system sets the focus to the first control
    }
    auto* dialog = reinterpret_cast<OptionsDialog*>(GetWindowLongPtrW(window, DWLP_USER));
    if (dialog == nullptr) return FALSE;
    if (message == WM_NCDESTROY) {
        SetWindowLongPtrW(window, DWLP_USER, 0);
        dialog->m_window = nullptr;
        dialog->m_logo = nullptr;
        return FALSE;
    }
    return dialog->OnMessage(message, wParam);
}

INT_PTR OptionsDialog::OnMessage(UINT message, WPARAM wParam) noexcept {
    switch (message) {
        case WM_COMMAND:
            OnCommand(LOWORD(wParam));
            return TRUE;
        case WM_HELP:
            OpenHelp();
            return TRUE;  // F1
        default:
            return FALSE;
    }
}

void OptionsDialog::OnOpen() noexcept {
    CreateLogo();
    CheckDlgButton(m_window, VM_CHECK_KNOBS_VERTICAL,
                   m_parts.preferences->KnobsDragVertical() ? BST_CHECKED : BST_UNCHECKED);
    SetTexts();
    CentreOverOwner(m_window);
}

void OptionsDialog::CreateLogo() noexcept {
    if (m_parts.buttonModule == nullptr) return;
    RECT place = kLogoPlace;
    MapDialogRect(m_window, &place);
    m_logo = CreateBitButton({.owner = m_window,
                              .module = m_parts.buttonModule,
                              .bitmap = m_parts.logo,
                              .command = VM_BUTTON_LOGO,
                              .position = {place.left, place.top}});
}

void OptionsDialog::SetTexts() noexcept {
    char version[64];
    std::snprintf(version, sizeof version, "Version %d.%d", kReelEffectsMajor, kReelEffectsMinor);
    TranslationHelper& texts = *m_parts.texts;
    const auto set = [&](int control, const char* key, const char* fallback) {
        SetDlgItemTextW(m_window, control, win32::Wide(texts.Translate(kTextsOfOptions, key, fallback)));
    };
    set(VM_TEXT_PRODUCT, "ProductName", kLibraryName);
    set(VM_TEXT_VERSION, "Version", version);
    set(VM_TEXT_OPTIONS, "Options", "Options");
    SetWindowTextW(m_window, win32::Wide(texts.Translate(kTextsOfOptions, "Title", kLibraryName)));
    // Texts are used as they are: a translation includes its letter for the Alt key, and OK and Cancel have Enter and
    // Escape.
    set(VM_CHECK_KNOBS_VERTICAL, "Up/Down Knobs Control", "Up / Down mouse control of circular knobs");
    const auto setButton = [&](int control, const char* key) {
        SetDlgItemTextW(m_window, control, win32::Wide(texts.Translate(kTextsOfButtons, key)));
    };
    setButton(VM_BUTTON_OK, "OK");
    setButton(VM_BUTTON_CANCEL, "Cancel");
    setButton(VM_BUTTON_HELP, "Help");
}

void OptionsDialog::OnCommand(int control) noexcept {
    switch (control) {
        case VM_BUTTON_OK:
            OnOk();
            break;
        case VM_BUTTON_CANCEL:
            EndDialog(m_window, 0);
            break;
        case VM_BUTTON_HELP:
            OpenHelp();
            break;
        case VM_BUTTON_LOGO:
            OpenWebPage(m_window);
            break;
        default:
            break;
    }
}

void OptionsDialog::OnOk() noexcept {
    // Stored before the dialog closes: a host that notices it closing may ask for the preference at once.
    if (GetDlgItem(m_window, VM_CHECK_KNOBS_VERTICAL) != nullptr) {
        m_parts.preferences->SetKnobsDragVertical(IsDlgButtonChecked(m_window, VM_CHECK_KNOBS_VERTICAL) ==
                                                  BST_CHECKED);
    }
    EndDialog(m_window, IDOK);
}

void OptionsDialog::OpenHelp() const noexcept try {
    static_cast<void>(m_parts.help->Show(m_window, help::kOptions, false));
} catch (...) {
    // No message: no failure to open help is reported.
}

}  // namespace velmora::support

#include "desktop/options.h"

#include <windows.h>
#include <shellapi.h>

#include <optional>

#include "platform/win32.h"
#include "text/encodings.h"

namespace velmora::support {
namespace {

constexpr wchar_t kViewer[] = L"%SystemRoot%\\hh.exe";
constexpr wchar_t kControlKey[] = L"CLSID\\{ADB880A6-D8FF-11CF-9377-00AA003B7A11}\\InprocServer32";
constexpr wchar_t kControlName[] = L"hhctrl.ocx";
constexpr WORD kControlOrdinal = 14;
constexpr UINT kShowContext = 15;  // the control's command to show the topic with this context number
constexpr DWORD kLongestControlPath = 260;

using HtmlHelpFunction = HWND(WINAPI*)(HWND owner, const char* file, UINT command, DWORD_PTR data);

// The HTML help control. Once loaded it stays: it may show windows until the process ends.
class HelpControl {
  public:
    // Null when there is none; a failed first attempt is not repeated.
    HtmlHelpFunction Entry() noexcept {
        if (m_givenUp) return nullptr;
        if (m_module == nullptr) Load();
        if (m_module != nullptr && m_entry == nullptr) {
            m_entry = reinterpret_cast<HtmlHelpFunction>(
                reinterpret_cast<void*>(GetProcAddress(m_module, MAKEINTRESOURCEA(kControlOrdinal))));
        }
        m_givenUp = m_entry == nullptr;
        return m_entry;
    }

  private:
    void Load() noexcept {
        wchar_t path[kLongestControlPath + 1] = {};
        DWORD size = kLongestControlPath * sizeof(wchar_t);
        // Also expands a path that is stored with environment variables.
        if (RegGetValueW(HKEY_CLASSES_ROOT, kControlKey, nullptr, RRF_RT_REG_SZ, nullptr, path, &size) ==
            ERROR_SUCCESS) {
            m_module = LoadLibraryW(path);
        }
        if (m_module == nullptr) m_module = LoadLibraryW(kControlName);
    }

    HMODULE m_module = nullptr;
    HtmlHelpFunction m_entry = nullptr;
    bool m_givenUp = false;
};

constinit HelpControl helpControl;

std::u16string ExistingShortPath(const std::u16string& path) {
    const DWORD size = GetShortPathNameW(win32::Wide(path.c_str()), nullptr, 0);
    if (size == 0) return {};
    std::u16string shortPath(size, u'\0');
    const DWORD length =
        GetShortPathNameW(win32::Wide(path.c_str()), reinterpret_cast<wchar_t*>(shortPath.data()), size);
    if (length == 0 || length >= size) return {};
    shortPath.resize(length);
    return shortPath;
}

// The short path of a file. When the file is missing, its folder's short path plus the file's own name; empty when the
// folder has no short path.
std::u16string ShortPath(const std::u16string& path) {
    if (std::u16string found = ExistingShortPath(path); !found.empty()) return found;
    const std::size_t nameStart = path.find_last_of(u"/\\") + 1;
    std::u16string folder = ExistingShortPath(path.substr(0, nameStart));
    return folder.empty() ? folder : folder + path.substr(nameStart);
}

// An exact 8-bit name for the same file: the path itself, or else its short path; nothing when neither can be
// converted.
std::optional<std::string> EightBitPath(const std::u16string& path) {
    if (std::optional<std::string> exact = NarrowExactly(path)) return exact;
    const std::u16string shortPath = ShortPath(path);
    return shortPath.empty() ? std::nullopt : NarrowExactly(shortPath);
}

}  // namespace

void HelpLauncher::SetFile(std::u16string folder, const std::string& fileName) {
    m_path = std::move(folder) + Widen(fileName);
}

std::int32_t HelpLauncher::Show(void* owner, std::int32_t topic, bool externalViewer) const {
    return externalViewer ? ShowInViewer(owner, topic) : ShowInProcess(owner, topic);
}

std::int32_t HelpLauncher::ShowInViewer(void* owner, std::int32_t topic) const {
    const std::wstring parameters = L"-mapID " + std::to_wstring(topic) + L" " + win32::Wide(m_path.c_str());
    SHELLEXECUTEINFOW execution = {};
    execution.cbSize = sizeof execution;
    execution.fMask = SEE_MASK_DOENVSUBST | SEE_MASK_FLAG_NO_UI;
    execution.hwnd = static_cast<HWND>(owner);
    execution.lpVerb = L"open";
    execution.lpFile = kViewer;
    execution.lpParameters = parameters.c_str();
    execution.nShow = SW_SHOWNORMAL;
    return ShellExecuteExW(&execution);
}

std::int32_t HelpLauncher::ShowInProcess(void* owner, std::int32_t topic) const {
    const std::optional<std::string> path = EightBitPath(m_path);
    if (!path) return 0;
    const HtmlHelpFunction entry = helpControl.Entry();
    if (entry == nullptr) return 0;
    const HWND shown =
        entry(static_cast<HWND>(owner), path->c_str(), kShowContext, static_cast<DWORD>(topic));
    return static_cast<std::int32_t>(reinterpret_cast<INT_PTR>(shown));
}

}  // namespace velmora::support

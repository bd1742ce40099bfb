#include "driver.h"

#include <shlobj.h>

#include <chrono>
#include <thread>

#include "programs/reelview/window/commands.h"

namespace velmora::reelview::test {
namespace {

void Pause(int milliseconds) {
    std::this_thread::sleep_for(std::chrono::milliseconds(milliseconds));
}

struct Search {
    DWORD process;
    bool isDialog;
    HWND found;
};

BOOL CALLBACK FindTop(HWND window, LPARAM argument) {
    auto& search = *reinterpret_cast<Search*>(argument);
    DWORD process = 0;
    GetWindowThreadProcessId(window, &process);
    wchar_t name[64] = {};
    GetClassNameW(window, name, 64);
    const wchar_t* const wanted = search.isDialog ? L"#32770" : L"Velmora Reel View";
    if (process != search.process || lstrcmpW(name, wanted) != 0 || !IsWindowVisible(window)) return TRUE;
    search.found = window;
    return FALSE;
}

HWND TopWindow(DWORD process, bool isDialog) {
    Search search = {process, isDialog, nullptr};
    EnumWindows(FindTop, reinterpret_cast<LPARAM>(&search));
    return search.found;
}

struct ControlSearch {
    int id;
    HWND found;
};

BOOL CALLBACK FindControl(HWND window, LPARAM argument) {
    auto& search = *reinterpret_cast<ControlSearch*>(argument);
    if (GetDlgCtrlID(window) != search.id) return TRUE;
    search.found = window;
    return FALSE;
}

BOOL CALLBACK AddText(HWND window, LPARAM argument) {
    *reinterpret_cast<std::wstring*>(argument) += TextOf(window) + L'\n';
    return TRUE;
}

LPARAM At(POINT place) {
    return MAKELPARAM(place.x, place.y);
}

}  // namespace

bool WaitFor(const std::function<bool()>& condition, double seconds) {
    const auto end = std::chrono::steady_clock::now() + std::chrono::duration<double>(seconds);
    while (!condition()) {
        if (std::chrono::steady_clock::now() > end) return false;
        Pause(10);
    }
    return true;
}

std::wstring TextOf(HWND window) {
    wchar_t text[1024] = {};
    SendMessageTimeoutW(window, WM_GETTEXT, 1024, reinterpret_cast<LPARAM>(text), SMTO_ABORTIFHUNG, 5000,
                        nullptr);
    return text;
}

std::vector<char> Clipboard(UINT format) {
    std::vector<char> bytes;
    if (!WaitFor([] { return OpenClipboard(nullptr) != FALSE; }, 5.0)) return bytes;
    if (const HANDLE data = GetClipboardData(format)) {
        const auto* const start = static_cast<const char*>(GlobalLock(data));
        if (start != nullptr) bytes.assign(start, start + GlobalSize(data));
        GlobalUnlock(data);
    }
    CloseClipboard();
    return bytes;
}

std::wstring Media(const std::wstring& name) {
    wchar_t folder[MAX_PATH] = {};
    GetEnvironmentVariableW(L"REELVIEW_MEDIA", folder, MAX_PATH);
    return std::wstring(folder) + L'\\' + name;
}

Program::Program(const std::wstring& arguments) {
    wchar_t program[MAX_PATH] = {};
    GetEnvironmentVariableW(L"REELVIEW", program, MAX_PATH);
    std::wstring line = L'"' + std::wstring(program) + L"\" " + arguments;
    STARTUPINFOW startup = {};
    startup.cb = sizeof startup;
    if (!CreateProcessW(nullptr, line.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup,
                        &m_process))
        return;
    WaitFor(
        [&] {
            m_window = TopWindow(m_process.dwProcessId, false);
            return m_window != nullptr || TopWindow(m_process.dwProcessId, true) != nullptr || !Lives();
        },
        60.0);
}

Program::~Program() {
    TerminateProcess(m_process.hProcess, 9);
    WaitForSingleObject(m_process.hProcess, 10000);
    CloseHandle(m_process.hThread);
    CloseHandle(m_process.hProcess);
}

bool Program::Answers() const {
    return SendMessageTimeoutW(m_window, WM_NULL, 0, 0, SMTO_NORMAL, 10000, nullptr) != 0;
}

HWND Program::Control(int id) const {
    ControlSearch search = {id, nullptr};
    EnumChildWindows(m_window, FindControl, reinterpret_cast<LPARAM>(&search));
    return search.found;
}

std::wstring Program::Status() const {
    return TextOf(Control(kControlStatus));
}

HWND Program::Dialog(double seconds) const {
    HWND dialog = nullptr;
    WaitFor([&] { return (dialog = TopWindow(m_process.dwProcessId, true)) != nullptr || !Lives(); },
            seconds);
    return dialog;
}

std::wstring Program::CloseDialogs() const {
    std::wstring texts;
    for (int i = 0; i < 10; ++i) {
        const HWND dialog = Dialog(i == 0 ? 10.0 : 0.3);
        if (dialog == nullptr) break;
        EnumChildWindows(dialog, AddText, reinterpret_cast<LPARAM>(&texts));
        PostMessageW(dialog, WM_COMMAND, GetDlgItem(dialog, IDCANCEL) != nullptr ? IDCANCEL : IDOK, 0);
        WaitFor([&] { return !IsWindow(dialog); }, 2.0);
    }
    return texts;
}

// The name field is the dialog's only editable one.
bool Program::ChooseFile(int command, const std::wstring& file, int type) const {
    Command(command);
    const HWND dialog = Dialog();
    if (dialog == nullptr) return false;
    constexpr int kFileName = 0x480, kFileNameBox = 0x47C;
    HWND field = GetDlgItem(dialog, kFileName);
    if (field == nullptr) field = GetDlgItem(dialog, kFileNameBox);
    Pause(300);
    if (type > 0) {
        constexpr int kFileType = 0x470;
        SendDlgItemMessageW(dialog, kFileType, CB_SETCURSEL, static_cast<WPARAM>(type - 1), 0);
        SendMessageW(dialog, WM_COMMAND, MAKEWPARAM(kFileType, CBN_SELENDOK),
                     reinterpret_cast<LPARAM>(GetDlgItem(dialog, kFileType)));
    }
    SendMessageW(field, WM_SETTEXT, 0, reinterpret_cast<LPARAM>(file.c_str()));
    PostMessageW(dialog, WM_COMMAND, IDOK, 0);
    return WaitFor([&] { return !IsWindow(dialog); }, 10.0);
}

// The list must be in the program's own memory: Wine does not pass one on to another process, as Windows does. It is
// freed by neither, so a few places are used in turn.
void Program::Drop(const std::vector<std::wstring>& files) {
    constexpr SIZE_T kPlaceBytes = 16384, kPlaces = 32;
    if (m_drops == nullptr) {
        m_drops = static_cast<char*>(
            VirtualAllocEx(Process(), nullptr, kPlaceBytes * kPlaces, MEM_COMMIT, PAGE_READWRITE));
    }
    DROPFILES head = {};
    head.pFiles = sizeof head;
    head.fWide = TRUE;
    std::wstring names;
    for (const std::wstring& file : files) names += file + L'\0';
    char* const place = m_drops + kPlaceBytes * (m_dropCount++ % kPlaces);
    WriteProcessMemory(Process(), place, &head, sizeof head, nullptr);
    WriteProcessMemory(Process(), place + sizeof head, names.c_str(), (names.size() + 1) * sizeof(wchar_t),
                       nullptr);
    PostMessageW(m_window, WM_DROPFILES, reinterpret_cast<WPARAM>(place), 0);
}

DWORD Program::Close() {
    PostMessageW(m_window, WM_CLOSE, 0, 0);
    if (WaitForSingleObject(m_process.hProcess, 15000) != WAIT_OBJECT_0) return 999;
    DWORD code = 0;
    GetExitCodeProcess(m_process.hProcess, &code);
    return code;
}

void Press(HWND window, int x, int y) {
    PostMessageW(window, WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(x, y));
    PostMessageW(window, WM_LBUTTONUP, 0, MAKELPARAM(x, y));
}

void Drag(HWND window, const std::vector<POINT>& way) {
    SendMessageW(window, WM_LBUTTONDOWN, MK_LBUTTON, At(way.front()));
    for (const POINT place : way) SendMessageW(window, WM_MOUSEMOVE, MK_LBUTTON, At(place));
    SendMessageW(window, WM_LBUTTONUP, 0, At(way.back()));
}

void Key(HWND window, WPARAM key) {
    SendMessageW(window, WM_KEYDOWN, key, 0);
    SendMessageW(window, WM_KEYUP, key, 0);
}

}  // namespace velmora::reelview::test

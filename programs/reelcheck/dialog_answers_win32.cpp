#include <windows.h>
#include <commdlg.h>
#include <shellapi.h>

#include "programs/reelcheck/dialog_answers.h"
#include "programs/reelcheck/entry_patch_win32.h"

namespace velmora::reelcheck {
namespace {

bool g_standsIn = false;
const char* g_path = nullptr;
int g_fileDialogs = 0, g_messages = 0, g_programs = 0, g_cancelled = 0;

decltype(&GetOpenFileNameW) g_getOpenFileName;
decltype(&GetSaveFileNameW) g_getSaveFileName;
decltype(&MessageBoxW) g_messageBox;
decltype(&ShellExecuteExW) g_shellExecute;

BOOL AnswerFile(OPENFILENAMEW* description) noexcept {
    ++g_fileDialogs;
    if (g_path == nullptr) return FALSE;
    return MultiByteToWideChar(CP_ACP, 0, g_path, -1, description->lpstrFile,
                               static_cast<int>(description->nMaxFile)) > 0;
}

BOOL WINAPI OpenFileName(OPENFILENAMEW* description) {
    return g_standsIn ? AnswerFile(description) : g_getOpenFileName(description);
}

BOOL WINAPI SaveFileName(OPENFILENAMEW* description) {
    return g_standsIn ? AnswerFile(description) : g_getSaveFileName(description);
}

int WINAPI Message(HWND owner, const wchar_t* text, const wchar_t* caption, UINT type) {
    if (!g_standsIn) return g_messageBox(owner, text, caption, type);
    ++g_messages;
    return IDOK;
}

BOOL WINAPI Execute(SHELLEXECUTEINFOW* execution) {
    if (!g_standsIn) return g_shellExecute(execution);
    ++g_programs;
    return TRUE;
}

// A dialog that becomes active is cancelled when it next processes messages.
LRESULT CALLBACK CancelDialog(int code, WPARAM window, LPARAM data) {
    wchar_t name[16] = L"";
    const HWND active = reinterpret_cast<HWND>(window);
    if (code == HCBT_ACTIVATE && GetClassNameW(active, name, 16) > 0 && lstrcmpW(name, L"#32770") == 0) {
        ++g_cancelled;
        PostMessageW(active, WM_COMMAND, IDCANCEL, 0);
    }
    return CallNextHookEx(nullptr, code, window, data);
}

}  // namespace

void InstallDialogHooks() {
    g_getOpenFileName = ReplaceExport(L"comdlg32.dll", "GetOpenFileNameW", OpenFileName);
    g_getSaveFileName = ReplaceExport(L"comdlg32.dll", "GetSaveFileNameW", SaveFileName);
    g_messageBox = ReplaceExport(L"user32.dll", "MessageBoxW", Message);
    g_shellExecute = ReplaceExport(L"shell32.dll", "ShellExecuteExW", Execute);
}

DialogAnswers::DialogAnswers(const char* path) noexcept {
    g_standsIn = true;
    g_path = path;
    g_fileDialogs = g_messages = g_programs = 0;
}

DialogAnswers::~DialogAnswers() {
    g_standsIn = false;
}

int DialogAnswers::FileDialogs() const noexcept {
    return g_fileDialogs;
}

int DialogAnswers::Messages() const noexcept {
    return g_messages;
}

int DialogAnswers::Programs() const noexcept {
    return g_programs;
}

DialogCanceller::DialogCanceller() noexcept
    : m_hook(SetWindowsHookExW(WH_CBT, CancelDialog, nullptr, GetCurrentThreadId())) {
    g_cancelled = 0;
}

DialogCanceller::~DialogCanceller() {
    if (m_hook != nullptr) UnhookWindowsHookEx(static_cast<HHOOK>(m_hook));
}

int DialogCanceller::Cancelled() const noexcept {
    return g_cancelled;
}

}  // namespace velmora::reelcheck

#include "desktop_fixture.h"

#include <chrono>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <thread>
#include <vector>

namespace velmora::support::test {
namespace {

constexpr auto kPatience = std::chrono::seconds(20);
constexpr auto kPause = std::chrono::milliseconds(2);

bool WaitFor(const std::function<bool()>& condition) {
    const auto end = std::chrono::steady_clock::now() + kPatience;
    while (!condition()) {
        if (std::chrono::steady_clock::now() > end) return false;
        std::this_thread::sleep_for(kPause);
    }
    return true;
}

BOOL CALLBACK FindVisibleDialog(HWND window, LPARAM found) {
    wchar_t name[16] = {};
    GetClassNameW(window, name, 16);
    if (lstrcmpW(name, L"#32770") != 0 || !IsWindowVisible(window)) return TRUE;
    *reinterpret_cast<HWND*>(found) = window;
    return FALSE;
}

// Null when there is none.
HWND DialogOfThread(DWORD thread) {
    HWND found = nullptr;
    EnumThreadWindows(thread, FindVisibleDialog, reinterpret_cast<LPARAM>(&found));
    return found;
}

HWND FocusOf(HWND dialog) {
    GUITHREADINFO info = {};
    info.cbSize = sizeof info;
    GetGUIThreadInfo(GetWindowThreadProcessId(dialog, nullptr), &info);
    return info.hwndFocus;
}

// Posted messages are processed in order, but a window may post another message in response.
void LetItWork(HWND dialog) {
    for (int i = 0; i < 3 && IsWindow(dialog); ++i) {
        SendMessageW(dialog, WM_NULL, 0, 0);
        std::this_thread::sleep_for(std::chrono::milliseconds(15));
    }
}

}  // namespace

Stored ReadStored(HKEY root, const char* key, const char* name) {
    char bytes[2048];
    DWORD size = sizeof bytes;
    const LSTATUS status = RegGetValueA(root, key, name, RRF_RT_REG_SZ, nullptr, bytes, &size);
    if (status != ERROR_SUCCESS) return {};
    return std::string(bytes, size);
}

void Store(HKEY root, const char* key, const char* name, const std::string& bytes, DWORD type) {
    HKEY opened = nullptr;
    ASSERT_EQ(RegCreateKeyExA(root, key, 0, nullptr, 0, KEY_WRITE, nullptr, &opened, nullptr), 0);
    EXPECT_EQ(RegSetValueExA(opened, name, 0, type, reinterpret_cast<const BYTE*>(bytes.data()),
                             static_cast<DWORD>(bytes.size())),
              0);
    RegCloseKey(opened);
}

RegisteredText::RegisteredText(const wchar_t* key, const std::wstring& text) : m_key(key) {
    DWORD size = sizeof m_before;
    m_hadOne = RegGetValueW(HKEY_LOCAL_MACHINE, key, nullptr, RRF_RT_REG_SZ, nullptr, m_before, &size) ==
               ERROR_SUCCESS;
    Set(text);
}

RegisteredText::~RegisteredText() {
    if (m_hadOne) Set(m_before);
    if (!m_hadOne) RegDeleteTreeW(HKEY_LOCAL_MACHINE, m_key);
}

void RegisteredText::Set(const std::wstring& text) const {
    EXPECT_EQ(RegSetKeyValueW(HKEY_LOCAL_MACHINE, m_key, nullptr, REG_SZ, text.c_str(),
                              static_cast<DWORD>((text.size() + 1) * sizeof(wchar_t))),
              ERROR_SUCCESS);
}

Status VM_CALL FakeLibrary::QueryInterface(const Guid* iid, void** out) {
    const bool known = std::memcmp(iid, &kIidMultiLingual, sizeof *iid) == 0;
    *out = known ? static_cast<IMultiLingual*>(this) : nullptr;
    if (known) ++references;
    return known ? kStatusOk : kStatusNoInterface;
}

std::int32_t VM_CALL FakeLibrary::GetText(const char* languageCode, std::int32_t, const char* key,
                                          char16_t* buffer, std::int32_t capacity) {
    language = languageCode;
    const bool isKnobs = std::string(key) == "Up/Down Knobs Control";
    if (!isKnobs && std::string(key) != "Help") return 0;
    lstrcpynW(reinterpret_cast<wchar_t*>(buffer),
              reinterpret_cast<const wchar_t*>(isKnobs ? m_knobs : m_help), capacity);
    return lstrlenW(reinterpret_cast<wchar_t*>(buffer));
}

ServicesModule::ServicesModule(const std::wstring& path) : m_module(LoadLibraryW(path.c_str())) {
    EXPECT_NE(m_module, nullptr);
    if (m_module == nullptr) std::abort();  // nothing else can be tested
    const auto find = [this](const char* name) {
        return reinterpret_cast<void*>(GetProcAddress(m_module, name));
    };
    m_services = reinterpret_cast<ServicesFunction>(find("GetServices"))();
    m_offer = reinterpret_cast<LibraryFunction>(find("Offer"));
    m_withdraw = reinterpret_cast<LibraryFunction>(find("Withdraw"));
}

ServicesModule::~ServicesModule() {
    FreeLibrary(m_module);
}

std::int32_t ShowOptionsTo(IShellServices& services, const std::function<void(HWND)>& user, HWND owner) {
    const DWORD thread = GetCurrentThreadId();
    std::thread userThread([&user, thread] {
        HWND dialog = nullptr;
        if (!WaitFor([&] { return (dialog = DialogOfThread(thread)) != nullptr; })) {
            ADD_FAILURE() << "no dialog was shown";
            return;
        }
        LetItWork(dialog);
        user(dialog);
        if (IsWindow(dialog)) PostMessageW(dialog, WM_COMMAND, IDCANCEL, 0);
    });
    const std::int32_t result = services.ShowOptions(owner);
    userThread.join();
    return result;
}

void Type(HWND dialog, WPARAM key) {
    const HWND focus = FocusOf(dialog);
    PostMessageW(focus != nullptr ? focus : dialog, WM_KEYDOWN, key, 1);
    PostMessageW(focus != nullptr ? focus : dialog, WM_KEYUP, key, static_cast<LPARAM>(0xC0000001u));
    LetItWork(dialog);
}

void TypeWithAlt(HWND dialog, wchar_t letter) {
    const HWND focus = FocusOf(dialog);
    PostMessageW(focus != nullptr ? focus : dialog, WM_SYSCHAR, letter, 0x20000001);
    LetItWork(dialog);
}

void Click(HWND control, int x, int y) {
    PostMessageW(control, WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(x, y));
    PostMessageW(control, WM_LBUTTONUP, 0, MAKELPARAM(x, y));
    LetItWork(GetParent(control));
}

int FocusedControl(HWND dialog) {
    return GetDlgCtrlID(FocusOf(dialog));
}

std::wstring TextOf(HWND window) {
    wchar_t text[512] = {};
    GetWindowTextW(window, text, 512);
    return text;
}

void DesktopTest::SetUp() {
    wchar_t temporary[MAX_PATH] = {};
    GetTempPathW(MAX_PATH, temporary);
    const std::wstring own = L"velmora desktop " + std::to_wstring(GetCurrentProcessId());
    m_folder = temporary + own + L"\\Kino \u0444\u0438\u043b\u044c\u043c \u6620\u753b\\";
    std::filesystem::create_directories(m_folder);
    m_modulePath = m_folder + L"desktop_module.dll";
    m_recordPath = m_folder + L"command line.txt";
    CopyToFolder(L"desktop_module.dll");
    CopyToFolder(L"resources.dll");
    SetEnvironmentVariableW(L"VELMORA_RECORD", m_recordPath.c_str());
    m_userSetting = ReadStored(HKEY_CURRENT_USER, kSettingsKey, kKnobs);
    m_machineSetting = ReadStored(HKEY_LOCAL_MACHINE, kSettingsKey, kKnobs);
    ForgetSettings();
}

void DesktopTest::TearDown() {
    ForgetSettings();
    if (m_userSetting) Store(HKEY_CURRENT_USER, kSettingsKey, kKnobs, *m_userSetting);
    if (m_machineSetting) Store(HKEY_LOCAL_MACHINE, kSettingsKey, kKnobs, *m_machineSetting);
    std::error_code ignored;
    std::filesystem::remove_all(std::filesystem::path(m_folder).parent_path().parent_path(), ignored);
}

void DesktopTest::ForgetSettings() {
    for (HKEY root : {HKEY_CURRENT_USER, HKEY_LOCAL_MACHINE}) RegDeleteTreeA(root, "Software\\Velmora");
}

std::wstring DesktopTest::RecordedCommandLine() const {
    std::ifstream file;
    // The recorder may still have the file open when it already has its final name.
    const bool isOpen = WaitFor([&] {
        file.open(std::filesystem::path(m_recordPath), std::ios::binary);
        return file.is_open();
    });
    if (!isOpen) return {};
    const std::string bytes((std::istreambuf_iterator<char>(file)), std::istreambuf_iterator<char>());
    return std::wstring(reinterpret_cast<const wchar_t*>(bytes.data()), bytes.size() / sizeof(wchar_t));
}

void DesktopTest::CopyToFolder(const wchar_t* name, const wchar_t* as) const {
    const std::wstring to = m_folder + (as != nullptr ? as : name);
    EXPECT_TRUE(CopyFileW(BesideProgram(name).c_str(), to.c_str(), FALSE))
        << std::filesystem::path(name).string();
}

std::wstring DesktopTest::BesideProgram(const wchar_t* name) {
    wchar_t path[MAX_PATH] = {};
    GetModuleFileNameW(nullptr, path, MAX_PATH);
    const std::wstring program = path;
    return program.substr(0, program.find_last_of(L'\\') + 1) + name;
}

}  // namespace velmora::support::test

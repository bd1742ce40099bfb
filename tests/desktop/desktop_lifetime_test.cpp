// Start, shut down, start again, unload: nothing is left behind.
#include <windows.h>
#include <psapi.h>

#include "desktop_fixture.h"
#include "desktop/bit_button.h"
#include "desktop/resource_ids.h"

namespace velmora::support::test {
namespace {

class LifetimeTest : public DesktopTest {};

bool HasButtonClass(const std::wstring& folder) {
    WNDCLASSW found = {};
    const HMODULE resources = GetModuleHandleW((folder + L"resources.dll").c_str());
    return resources != nullptr && GetClassInfoW(resources, kBitButtonClass, &found);
}

TEST_F(LifetimeTest, LastLibraryShutsDownAndTheNextStartsAgain) {
    FakeLibrary first(u"");
    FakeLibrary second(u"");
    const ServicesModule services(m_modulePath);
    EXPECT_EQ(services->ShowOptions(nullptr), 0) << "not started";
    services.Offer(first);
    EXPECT_FALSE(services->Start(services.Module(), nullptr, "other.chm", 1)) << "started already";
    services.Offer(second);
    EXPECT_TRUE(HasButtonClass(m_folder));
    services.Withdraw(first);
    EXPECT_TRUE(HasButtonClass(m_folder));
    services.Withdraw(second);
    EXPECT_EQ(GetModuleHandleW((m_folder + L"resources.dll").c_str()), nullptr);
    services.Offer(first);
    EXPECT_TRUE(HasButtonClass(m_folder));
    services.Withdraw(first);
    EXPECT_EQ(GetModuleHandleW((m_folder + L"resources.dll").c_str()), nullptr);
}

const ServicesModule* shownServices = nullptr;
FakeLibrary* onlyLibrary = nullptr;

void CALLBACK WithdrawLibrary(HWND, UINT, UINT_PTR timer, DWORD) {
    KillTimer(nullptr, timer);
    shownServices->Withdraw(*onlyLibrary);
}

TEST_F(LifetimeTest, ShutDownClosesADialogThatIsOpen) {
    FakeLibrary library(u"");
    const ServicesModule services(m_modulePath);
    services.Offer(library);
    // The timer runs inside the dialog's message loop, on the thread that shows it, like a host's own code.
    shownServices = &services;
    onlyLibrary = &library;
    const UINT_PTR timer = SetTimer(nullptr, 0, 100, WithdrawLibrary);
    EXPECT_EQ(services->ShowOptions(nullptr), 0);
    KillTimer(nullptr, timer);
    EXPECT_EQ(GetModuleHandleW((m_folder + L"resources.dll").c_str()), nullptr);
    services.Offer(library);
    services.Withdraw(library);
}

struct Usage {
    DWORD handles = 0;
    DWORD modules = 0;
    DWORD gdi = 0;
    DWORD user = 0;
    // Numbers of new objects. Free numbers are reused, so they grow only when objects leak. Some systems count
    // nothing else.
    UINT_PTR gdiNumber = 0;
    UINT_PTR handleNumber = 0;
    SIZE_T memory = 0;
};

Usage CurrentUsage() {
    Usage usage;
    const HANDLE process = GetCurrentProcess();
    GetProcessHandleCount(process, &usage.handles);
    HMODULE modules[256];
    DWORD bytes = 0;
    EnumProcessModules(process, modules, sizeof modules, &bytes);
    usage.modules = bytes / sizeof(HMODULE);
    usage.gdi = GetGuiResources(process, GR_GDIOBJECTS);
    usage.user = GetGuiResources(process, GR_USEROBJECTS);
    const HBRUSH brush = CreateSolidBrush(RGB(1, 2, 3));
    usage.gdiNumber = reinterpret_cast<UINT_PTR>(brush) & 0xFFFF;
    DeleteObject(brush);
    const HANDLE event = CreateEventW(nullptr, FALSE, FALSE, nullptr);
    usage.handleNumber = reinterpret_cast<UINT_PTR>(event) / 4;
    CloseHandle(event);
    PROCESS_MEMORY_COUNTERS memory = {};
    GetProcessMemoryInfo(process, &memory, sizeof memory);
    usage.memory = memory.PagefileUsage;
    return usage;
}

// Answers every dialog of this thread with OK as soon as it becomes active.
LRESULT CALLBACK AnswerDialogs(int code, WPARAM window, LPARAM data) {
    if (code == HCBT_ACTIVATE) PostMessageW(reinterpret_cast<HWND>(window), WM_COMMAND, IDOK, 0);
    return CallNextHookEx(nullptr, code, window, data);
}

// Repeats a round and expects the process to hold the same resources afterwards as before.
void ExpectNothingStays(const std::function<void()>& round) {
    constexpr int kRounds = 200;
    constexpr int kWarmUp = 10;
    const HHOOK hook = SetWindowsHookExW(WH_CBT, AnswerDialogs, nullptr, GetCurrentThreadId());
    for (int i = 0; i < kWarmUp; ++i) round();
    const Usage before = CurrentUsage();
    for (int i = 0; i < kRounds && !testing::Test::HasFatalFailure(); ++i) round();
    const Usage after = CurrentUsage();
    UnhookWindowsHookEx(hook);
    // One leaked handle or object per round would be 200; a few may come from the system's own caches.
    constexpr DWORD kFew = 20;
    EXPECT_LE(after.handles, before.handles + kFew);
    EXPECT_EQ(after.modules, before.modules);
    EXPECT_LE(after.gdi, before.gdi + kFew);
    EXPECT_LE(after.user, before.user + kFew);
    EXPECT_LE(after.gdiNumber, before.gdiNumber + kFew);
    EXPECT_LE(after.handleNumber, before.handleNumber + kFew);
    const auto number = [](auto value) { return static_cast<unsigned>(value); };
    std::printf(
        "%d rounds: handle number %u -> %u, modules %u -> %u, GDI number %u -> %u, memory %u -> %u KiB\n",
        kRounds, number(before.handleNumber), number(after.handleNumber), number(before.modules),
        number(after.modules), number(before.gdiNumber), number(after.gdiNumber),
        number(before.memory / 1024), number(after.memory / 1024));
}

TEST_F(LifetimeTest, NothingStaysOver200Rounds) {
    FakeLibrary library(u"");
    ExpectNothingStays([&] {
        const ServicesModule services(m_modulePath);
        services.Offer(library);
        ASSERT_EQ(services->ShowOptions(nullptr), 1);
        services.Withdraw(library);
    });
    EXPECT_EQ(GetModuleHandleW(m_modulePath.c_str()), nullptr);
    EXPECT_EQ(library.references, 1u);
}

}  // namespace
}  // namespace velmora::support::test

// The two ways to open the help file, with stand-ins for the viewer and the control.
#include <filesystem>

#include "desktop_fixture.h"
#include "help_control_standin.h"
#include "desktop/resource_ids.h"

namespace velmora::support::test {
namespace {

constexpr wchar_t kControlKey[] =
    L"Software\\Classes\\CLSID\\{ADB880A6-D8FF-11CF-9377-00AA003B7A11}\\InprocServer32";

HelpControlCall& Calls() {
    const HMODULE module = GetModuleHandleW(L"help_control_standin.dll");
    EXPECT_NE(module, nullptr);
    return *reinterpret_cast<LastCallFunction>(reinterpret_cast<void*>(GetProcAddress(module, "LastCall")))();
}

class HelpTest : public DesktopTest {};

TEST_F(HelpTest, StartsTheViewerWithExactlyTheseArguments) {
    // The viewer is looked up in the system's folder, which is an environment variable.
    wchar_t systemRoot[MAX_PATH] = {};
    GetEnvironmentVariableW(L"SystemRoot", systemRoot, MAX_PATH);
    CopyToFolder(L"command_line_recorder.exe", L"hh.exe");
    FakeLibrary library(u"");
    const ServicesModule services(m_modulePath);
    services.Offer(library);
    for (const std::int32_t topic : {0, 101, -7}) {
        std::filesystem::remove(m_recordPath);
        SetEnvironmentVariableW(L"SystemRoot", m_folder.substr(0, m_folder.size() - 1).c_str());
        const std::int32_t started = services->ShowHelp(nullptr, topic, 1);
        SetEnvironmentVariableW(L"SystemRoot", systemRoot);
        EXPECT_NE(started, 0);
        const std::wstring line = RecordedCommandLine();
        const std::wstring expected =
            L"-mapID " + std::to_wstring(topic) + L" " + m_folder + L"VMReelEffects.chm";
        EXPECT_TRUE(line.ends_with(L" " + expected)) << testing::PrintToString(line);
        EXPECT_NE(line.find(L"hh.exe"), std::wstring::npos);
    }
    services.Withdraw(library);
    EXPECT_EQ(services->ShowHelp(nullptr, 101, 1), 0) << "shut down";
}

TEST_F(HelpTest, CallsTheControlThatTheRegistryNames) {
    RegisteredText control(kControlKey, BesideProgram(L"help_control_standin.dll"));
    FakeLibrary library(u"");
    const ServicesModule services(m_modulePath);
    services.Offer(library);
    const HWND owner = GetDesktopWindow();
    EXPECT_EQ(services->ShowHelp(owner, 205, 0), 0x1234) << "the control's answer";
    EXPECT_EQ(Calls().owner, owner);
    EXPECT_EQ(Calls().command, 15u);
    EXPECT_EQ(Calls().data, 205u);
    // The library's folder has no 8-bit name, so the control gets another path to the same folder.
    const std::string file = Calls().file;
    const std::size_t nameStart = file.find_last_of('\\') + 1;
    EXPECT_EQ(file.substr(nameStart), "VMReelEffects.chm");
    const std::filesystem::path folder = file.substr(0, nameStart);
    wchar_t longFolder[MAX_PATH] = {};
    GetLongPathNameW(folder.c_str(), longFolder, MAX_PATH);
    EXPECT_EQ(lstrcmpiW(longFolder, m_folder.c_str()), 0) << file;

    // The entry point is cached, so another control in the registry is not even looked up.
    control.Set(L"C:\\no such control.ocx");
    const int before = Calls().calls;
    EXPECT_EQ(services->ShowHelp(owner, 0, 0), 0x1234);
    EXPECT_EQ(Calls().calls, before + 1);
    EXPECT_EQ(Calls().data, 0u);

    const auto askForHelp = [&](HWND dialog) {
        Click(GetDlgItem(dialog, VM_BUTTON_HELP));
        EXPECT_EQ(Calls().owner, dialog);
        EXPECT_EQ(Calls().data, 300u);
    };
    ShowOptionsTo(*services, askForHelp);
    services.Withdraw(library);
}

TEST_F(HelpTest, TakesTheControlByNameWhenTheRegistryNamesNone) {
    const RegisteredText control(kControlKey, L"C:\\no such control.ocx");
    FakeLibrary library(u"");
    const ServicesModule services(m_modulePath);
    services.Offer(library);
    ASSERT_EQ(GetModuleHandleW(L"hhctrl.ocx"), nullptr);
    EXPECT_EQ(services->ShowHelp(nullptr, 1, 0), 0) << "the system's control; there is no help file";
    EXPECT_NE(GetModuleHandleW(L"hhctrl.ocx"), nullptr);
    services.Withdraw(library);
}

TEST_F(HelpTest, GivesUpForGoodAfterAControlWithoutEntryPoint) {
    RegisteredText control(kControlKey, BesideProgram(L"resources.dll"));
    FakeLibrary library(u"");
    const ServicesModule services(m_modulePath);
    services.Offer(library);
    EXPECT_EQ(services->ShowHelp(nullptr, 1, 0), 0);
    control.Set(BesideProgram(L"help_control_standin.dll"));
    EXPECT_EQ(services->ShowHelp(nullptr, 1, 0), 0);
    services.Withdraw(library);
}

}  // namespace
}  // namespace velmora::support::test

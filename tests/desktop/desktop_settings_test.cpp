// The preference in the registry, which is read at start and written by the dialog.
#include "desktop_fixture.h"
#include "desktop/resource_ids.h"

namespace velmora::support::test {
namespace {

using namespace std::string_literals;

class SettingsTest : public DesktopTest {};

TEST_F(SettingsTest, ReadsTheUsersTextThenTheMachines) {
    const struct {
        const char* name;
        Stored user;
        Stored machine;
        DWORD userType;
        bool isOn;
    } rows[] = {
        {"nothing stored", {}, {}, REG_SZ, false},
        {"user yes", "yes\0"s, {}, REG_SZ, true},
        {"user capital", "Yes\0"s, {}, REG_SZ, false},
        {"another word with y", "yonder\0"s, {}, REG_SZ, true},
        {"not terminated", "y"s, {}, REG_SZ, true},
        {"empty user text hides the machine's", "\0"s, "yes\0"s, REG_SZ, false},
        {"machine only", {}, "yes\0"s, REG_SZ, true},
        {"user before machine", "no\0"s, "yes\0"s, REG_SZ, false},
        {"not a text", "y\0\0\0"s, {}, REG_DWORD, false},
        {"not a text, machine's is", "n\0\0\0"s, "yes\0"s, REG_BINARY, true},
        {"as long as may be", "y"s + std::string(1022, 'e') + '\0', {}, REG_SZ, true},
        {"too long", "y"s + std::string(1023, 'e') + '\0', {}, REG_SZ, false},
    };
    const ServicesModule services(m_modulePath);
    for (const auto& row : rows) {
        SCOPED_TRACE(row.name);
        ForgetSettings();
        if (row.user) Store(HKEY_CURRENT_USER, kSettingsKey, kKnobs, *row.user, row.userType);
        if (row.machine) Store(HKEY_LOCAL_MACHINE, kSettingsKey, kKnobs, *row.machine);
        ASSERT_TRUE(services->Start(services.Module(), nullptr, "VMReelEffects.chm", 0));
        EXPECT_EQ(services->KnobsDragVertical(), row.isOn);
        services->ShutDown();
    }
}

TEST_F(SettingsTest, OkWritesTheUsersTextAndLeavesTheMachines) {
    Store(HKEY_LOCAL_MACHINE, kSettingsKey, kKnobs, "yes\0"s);
    FakeLibrary library(u"");
    const ServicesModule services(m_modulePath);
    services.Offer(library);
    const auto pressOk = [](HWND dialog) { Click(GetDlgItem(dialog, VM_BUTTON_OK)); };
    EXPECT_EQ(ShowOptionsTo(*services, pressOk), 1);
    EXPECT_EQ(ReadStored(HKEY_CURRENT_USER, kSettingsKey, kKnobs), "yes\0"s);

    const auto clearAndPressOk = [](HWND dialog) {
        Click(GetDlgItem(dialog, VM_CHECK_KNOBS_VERTICAL));
        Click(GetDlgItem(dialog, VM_BUTTON_OK));
    };
    EXPECT_EQ(ShowOptionsTo(*services, clearAndPressOk), 1);
    EXPECT_FALSE(services->KnobsDragVertical());
    EXPECT_EQ(ReadStored(HKEY_CURRENT_USER, kSettingsKey, kKnobs), "no\0"s);
    EXPECT_EQ(ReadStored(HKEY_LOCAL_MACHINE, kSettingsKey, kKnobs), "yes\0"s);
    services.Withdraw(library);
}

// A closing dialog remains a window for a while, so a caller that waits for its end may check what OK has stored.
TEST_F(SettingsTest, OkStoresBeforeTheDialogEnds) {
    FakeLibrary library(u"");
    const ServicesModule services(m_modulePath);
    services.Offer(library);
    EXPECT_EQ(ShowOptionsTo(*services,
                            [&](HWND dialog) {
                                CheckDlgButton(dialog, VM_CHECK_KNOBS_VERTICAL, BST_CHECKED);
                                EXPECT_FALSE(services->KnobsDragVertical());
                                SendMessageW(dialog, WM_COMMAND, VM_BUTTON_OK, 0);
                                EXPECT_TRUE(services->KnobsDragVertical());
                                EXPECT_EQ(ReadStored(HKEY_CURRENT_USER, kSettingsKey, kKnobs), "yes\0"s);
                            }),
              1);
    ForgetSettings();
    EXPECT_EQ(ShowOptionsTo(*services,
                            [](HWND dialog) {
                                SendMessageW(GetDlgItem(dialog, VM_CHECK_KNOBS_VERTICAL), WM_CLOSE, 0, 0);
                                SendMessageW(dialog, WM_COMMAND, VM_BUTTON_OK, 0);
                            }),
              1);
    EXPECT_TRUE(services->KnobsDragVertical()) << "without the check box nothing is chosen";
    EXPECT_EQ(ReadStored(HKEY_CURRENT_USER, kSettingsKey, kKnobs), Stored());
    services.Withdraw(library);
}

TEST_F(SettingsTest, CancelChangesNothing) {
    FakeLibrary library(u"");
    const ServicesModule services(m_modulePath);
    services.Offer(library);
    for (const int way : {VM_BUTTON_CANCEL, VK_ESCAPE}) {
        const auto changeAndLeave = [way](HWND dialog) {
            Click(GetDlgItem(dialog, VM_CHECK_KNOBS_VERTICAL));
            EXPECT_EQ(IsDlgButtonChecked(dialog, VM_CHECK_KNOBS_VERTICAL), UINT{BST_CHECKED});
            if (way == VK_ESCAPE) Type(dialog, VK_ESCAPE);
            if (way == VM_BUTTON_CANCEL) Click(GetDlgItem(dialog, VM_BUTTON_CANCEL));
            EXPECT_FALSE(IsWindow(dialog));
        };
        EXPECT_EQ(ShowOptionsTo(*services, changeAndLeave), 0);
        EXPECT_FALSE(services->KnobsDragVertical());
        EXPECT_EQ(ReadStored(HKEY_CURRENT_USER, kSettingsKey, kKnobs), Stored());
    }
    services.Withdraw(library);
}

TEST_F(SettingsTest, KeepsTheChoiceWhenTheRegistryRefuses) {
    // A volatile key, which lives only until the system restarts, refuses permanent subkeys.
    HKEY refusing = nullptr;
    ASSERT_EQ(RegCreateKeyExA(HKEY_CURRENT_USER, "Software\\Velmora", 0, nullptr, REG_OPTION_VOLATILE,
                              KEY_ALL_ACCESS, nullptr, &refusing, nullptr),
              0);
    RegCloseKey(refusing);
    FakeLibrary library(u"");
    const ServicesModule services(m_modulePath);
    services.Offer(library);
    const auto setAndPressOk = [](HWND dialog) {
        Click(GetDlgItem(dialog, VM_CHECK_KNOBS_VERTICAL));
        Click(GetDlgItem(dialog, VM_BUTTON_OK));
    };
    EXPECT_EQ(ShowOptionsTo(*services, setAndPressOk), 1);
    EXPECT_TRUE(services->KnobsDragVertical());
    EXPECT_EQ(ReadStored(HKEY_CURRENT_USER, kSettingsKey, kKnobs), Stored());
    services.Withdraw(library);
}

}  // namespace
}  // namespace velmora::support::test

// The saver with the system's real dialogs, which a second thread reads and answers like a user.
#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <thread>

#include "user_presets/dialogs.h"
#include "user_presets/preset_file.h"
#include "user_presets/preset_saver.h"
#include "tests/user_presets/dialog_driver.h"
#include "tests/user_presets/fake_library.h"
#include "tests/user_presets/temporary_folder.h"

namespace velmora {
namespace {

using tests::FakeLibrary;
using tests::FakeTexts;
using tests::kIndexOfLook;
using tests::Press;
using tests::SeeMessage;
using tests::SeenFileDialog;
using tests::SeenMessage;
using tests::TemporaryFolder;
using tests::WaitForEnd;
using tests::WaitForMessage;

void ExpectMessage(const SeenMessage& seen, const wchar_t* caption, const wchar_t* text) {
    EXPECT_EQ(seen.caption, caption);
    EXPECT_EQ(seen.text, text);
    EXPECT_EQ(seen.buttons, 1);
    EXPECT_TRUE(seen.hasOk);
    EXPECT_TRUE(seen.hasExclamation);
}

class PresetDialogsTest : public testing::Test {
  protected:
    // Brings the host's window to the foreground: messages must not belong to another program's window, which may
    // close and take them along.
    PresetDialogsTest() { SetForegroundWindow(m_host); }
    ~PresetDialogsTest() override {
        m_saver->Release();
        DestroyWindow(m_host);
    }

    // Runs an operation while `user` acts in another thread.
    template <typename Operation>
    std::int32_t Run(const Operation& operation, const std::function<void()>& user) {
        std::thread thread(user);
        const std::int32_t result = operation();
        thread.join();
        return result;
    }
    std::int32_t Save(const std::function<void()>& user, const char* language = nullptr) {
        return Run([&] { return m_saver->SavePreset(m_host, &m_library, kIndexOfLook, &m_record, language); },
                   user);
    }
    std::int32_t Load(const std::function<void()>& user, const char* language = nullptr) {
        return Run([&] { return m_saver->LoadPreset(m_host, &m_library, kIndexOfLook, &m_record, language); },
                   user);
    }
    HWND AnswerFileDialog(const std::string& fileName) { return tests::AnswerFileDialog(fileName, &m_seen); }
    void AnswerMessage(SeenMessage* seen) {
        HWND box = WaitForMessage();
        if (box == nullptr) {
            ADD_FAILURE() << "no message";
            return;
        }
        Sleep(100);
        *seen = SeeMessage(box);
        Press(box, IDOK);
    }

    HWND m_host = CreateWindowW(L"Static", L"host", WS_OVERLAPPEDWINDOW | WS_VISIBLE, 0, 0, 300, 200, nullptr,
                                nullptr, nullptr, nullptr);
    IPresetSaver* m_saver = CreatePresetSaver();
    FakeLibrary m_library;
    TemporaryFolder m_folder;
    PresetRecord m_record = tests::MakeRecord(kIndexOfLook, 0);
    SeenFileDialog m_seen;
};

TEST_F(PresetDialogsTest, SavesUnderTheDefaultExtension) {
    EXPECT_EQ(Save([&] { AnswerFileDialog(m_folder.File("mine")); }), 0);
    EXPECT_EQ(m_seen.title, L"Save Preset");
    EXPECT_EQ(m_seen.label, L"Preset Files (*.fxprelb)");
    EXPECT_EQ(m_seen.labels, 1);
    ASSERT_EQ(m_folder.Count(), 1u);
    PresetRecord loaded = {};
    EXPECT_TRUE(ReadPreset(m_folder.File("mine.fxprelb").c_str(), &loaded));
    EXPECT_STREQ(loaded.effectName, "Film Look");

    EXPECT_EQ(Load([&] { AnswerFileDialog(m_folder.File("mine.fxprelb")); }), 0);
    EXPECT_EQ(m_seen.title, L"Load Preset");
    EXPECT_EQ(m_seen.label, L"Preset Files (*.fxprelb)");
    EXPECT_EQ(m_record.count, loaded.count);
}

TEST_F(PresetDialogsTest, CancelIsSilent) {
    wchar_t before[MAX_PATH] = L"", after[MAX_PATH] = L"";
    GetCurrentDirectoryW(MAX_PATH, before);
    EXPECT_EQ(Save([&] { AnswerFileDialog(""); }), 0);
    EXPECT_EQ(Load([&] { AnswerFileDialog(""); }), 0);
    GetCurrentDirectoryW(MAX_PATH, after);
    EXPECT_STREQ(before, after) << "the host's current folder";
}

TEST_F(PresetDialogsTest, AsksBeforeAnExistingPresetIsReplaced) {
    m_folder.Write("mine.fxprelb", "old");
    const std::string name = m_folder.File("mine.fxprelb");
    EXPECT_EQ(Save([&] {
                  HWND dialog = AnswerFileDialog(name);
                  HWND question = WaitForMessage();
                  ASSERT_NE(question, nullptr);
                  EXPECT_EQ(m_folder.Read("mine.fxprelb"), "old");
                  Press(question, IDNO);
                  ASSERT_TRUE(WaitForEnd(question));
                  Press(dialog, IDCANCEL);
              }),
              0);
    EXPECT_EQ(m_folder.Read("mine.fxprelb"), "old");
    EXPECT_EQ(Save([&] {
                  AnswerFileDialog(name);
                  HWND question = WaitForMessage();
                  ASSERT_NE(question, nullptr);
                  Press(question, IDYES);
              }),
              0);
    EXPECT_NE(m_folder.Read("mine.fxprelb"), "old");
}

TEST_F(PresetDialogsTest, SpeaksTheUsersLanguage) {
    FakeTexts texts;
    texts.texts = {{{4, "Save Preset As"}, u"Vorgabe speichern unter"},
                   {{4, "Open Preset"}, u"\u30D7\u30EA\u30BB\u30C3\u30C8\u3092\u958B\u304F"},
                   {{4, "Preset Files"}, u"Vorgabedateien"}};
    m_library.texts = &texts;
    EXPECT_EQ(Save([&] { AnswerFileDialog(""); }, "de"), 0);
    EXPECT_EQ(m_seen.title, L"Vorgabe speichern unter");
    EXPECT_EQ(m_seen.label, L"Vorgabedateien (*.fxprelb)");
    EXPECT_EQ(Load([&] { AnswerFileDialog(""); }, "de"), 0);
    EXPECT_EQ(m_seen.title, L"\u30D7\u30EA\u30BB\u30C3\u30C8\u3092\u958B\u304F");
}

TEST_F(PresetDialogsTest, TellsOfFailuresInMessages) {
    SeenMessage seen;
    EXPECT_EQ(Run([&] { return m_saver->SavePreset(nullptr, nullptr, 0, nullptr, nullptr); },
                  [&] { AnswerMessage(&seen); }),
              1);
    ExpectMessage(seen, L"Preset save error",
                  L"Sorry, can't save preset.\nPossible reason: access denied or disk is full.");
    const std::string broken = m_folder.Write("broken.fxprelb", "<Preset");
    EXPECT_EQ(Load([&] {
                  AnswerFileDialog(broken);
                  AnswerMessage(&seen);
              }),
              1);
    ExpectMessage(
        seen, L"Preset load error",
        L"Sorry, can't open the preset specified.\nPossible reason: access denied or file is corrupted.");
    const std::string other =
        m_folder.Write("other.fxprelb", "<Preset EffectName='Film Damage'><parameter/></Preset>");
    EXPECT_EQ(Load([&] {
                  AnswerFileDialog(other);
                  AnswerMessage(&seen);
              }),
              2);
    ExpectMessage(
        seen, L"Preset open warning",
        L"Error trying to open a Film Damage preset. This can only open Film Look presets. Please try "
        L"again.");
}

// The message belongs to the window that the user is working in, not to the file dialog's owner.
TEST_F(PresetDialogsTest, MessagesAreOwnedByTheForegroundWindow) {
    if (GetForegroundWindow() != m_host) GTEST_SKIP() << "the screen keeps its foreground window";
    HWND owner = nullptr;
    EXPECT_EQ(Run([&] { return m_saver->LoadPreset(nullptr, nullptr, 0, nullptr, nullptr); },
                  [&] {
                      HWND box = WaitForMessage();
                      owner = GetWindow(box, GW_OWNER);
                      Press(box, IDOK);
                  }),
              1);
    EXPECT_EQ(owner, m_host);
}

}  // namespace
}  // namespace velmora

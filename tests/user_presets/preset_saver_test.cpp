// The saver's flows, with dialogs answered by the test.
#include "user_presets/preset_saver.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "user_presets/preset_file.h"
#include "user_presets/dialogs.h"
#include "tests/user_presets/fake_library.h"
#include "tests/user_presets/temporary_folder.h"

namespace velmora {
namespace {

using tests::FakeLibrary;
using tests::FakeTexts;
using tests::kIndexOfDamage;
using tests::kIndexOfLook;
using tests::TemporaryFolder;

// The user's actions, and what the user was shown.
struct User {
    bool choosesFile = false;
    std::u16string fileName;
    void* owner = nullptr;
    std::vector<std::u16string>
        shown;  // "open" or "save", title, label, pattern, extension; or text, caption
};
User g_user;

bool Answer(const char16_t* kind, const FileDialog& dialog, DialogFileName& fileName) {
    const char16_t* pattern = dialog.filter + std::char_traits<char16_t>::length(dialog.filter) + 1;
    g_user.owner = dialog.owner;
    g_user.shown.insert(g_user.shown.end(),
                        {kind, dialog.title, dialog.filter, pattern, dialog.defaultExtension});
    fileName.fill(0);
    g_user.fileName.copy(fileName.data(), fileName.size() - 1);
    return g_user.choosesFile;
}

}  // namespace

bool ShowOpenDialog(const FileDialog& dialog, DialogFileName& fileName) noexcept {
    return Answer(u"open", dialog, fileName);
}
bool ShowSaveDialog(const FileDialog& dialog, DialogFileName& fileName) noexcept {
    return Answer(u"save", dialog, fileName);
}
void ShowWarning(const char16_t* text, const char16_t* caption) noexcept {
    g_user.shown.insert(g_user.shown.end(), {text, caption});
}

namespace {

using Shown = std::vector<std::u16string>;

const Shown kSaveShown = {u"save", u"Save Preset", u"Preset Files (*.fxprelb)", u"*.fxprelb", u"fxprelb"};
const Shown kOpenShown = {u"open", u"Load Preset", u"Preset Files (*.fxprelb)", u"*.fxprelb", u"fxprelb"};
const Shown kSaveError = {u"Sorry, can't save preset.\nPossible reason: access denied or disk is full.",
                          u"Preset save error"};
const Shown kLoadError = {
    u"Sorry, can't open the preset specified.\nPossible reason: access denied or file is corrupted.",
    u"Preset load error"};

Shown operator+(Shown a, const Shown& b) {
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

std::u16string Wide(const std::string& text) {
    return {text.begin(), text.end()};
}

class PresetSaverTest : public testing::Test {
  protected:
    PresetSaverTest() { g_user = {}; }
    ~PresetSaverTest() override { EXPECT_EQ(m_saver->Release(), 0u); }

    void UserChooses(const std::u16string& fileName) {
        g_user.shown.clear();
        g_user.choosesFile = true;
        g_user.fileName = fileName;
    }
    std::int32_t Save(IEffectLibrary* library, PresetRecord* record, const char* language = nullptr) {
        return m_saver->SavePreset(this, library, kIndexOfLook, record, language);
    }
    std::int32_t Load(IEffectLibrary* library, PresetRecord* record, const char* language = nullptr,
                      std::uint32_t effectIndex = kIndexOfLook) {
        return m_saver->LoadPreset(this, library, effectIndex, record, language);
    }

    IPresetSaver* m_saver = CreatePresetSaver();
    FakeLibrary m_library;
    TemporaryFolder m_folder;
    PresetRecord m_record = tests::MakeRecord(kIndexOfLook, 0);
};

TEST_F(PresetSaverTest, SavesAndLoadsBack) {
    UserChooses(Wide(m_folder.File("a.fxprelb")));
    EXPECT_EQ(Save(&m_library, &m_record), 0);
    EXPECT_EQ(g_user.shown, kSaveShown);
    EXPECT_EQ(g_user.owner, this);
    EXPECT_STREQ(m_record.libraryName, "Velmora Reel Effects");
    EXPECT_STREQ(m_record.effectName, "Film Look");

    g_user.shown.clear();
    PresetRecord loaded = {};
    EXPECT_EQ(Load(&m_library, &loaded), 0);
    EXPECT_EQ(g_user.shown, kOpenShown);
    EXPECT_STREQ(loaded.name, m_record.name);
    EXPECT_EQ(loaded.count, m_record.count);
}

TEST_F(PresetSaverTest, CancelIsSilentAndChangesNothing) {
    const PresetRecord before = m_record;
    EXPECT_EQ(Save(&m_library, &m_record), 0);
    EXPECT_EQ(Load(&m_library, &m_record), 0);
    EXPECT_EQ(g_user.shown, kSaveShown + kOpenShown);
    // NOLINTNEXTLINE(bugprone-suspicious-memory-comparison): every byte, whatever it means
    EXPECT_EQ(std::memcmp(&before, &m_record, sizeof before), 0);
}

TEST_F(PresetSaverTest, FailsWithoutADialogWhenThereIsNoRecord) {
    EXPECT_EQ(Save(&m_library, nullptr), 1);
    EXPECT_EQ(g_user.shown, kSaveError);
    g_user.shown.clear();
    EXPECT_EQ(Load(&m_library, nullptr, "de"), 1);
    EXPECT_EQ(g_user.shown, kLoadError);
}

TEST_F(PresetSaverTest, TellsWhenAFileCannotBeUsed) {
    const std::u16string names[] = {
        u"",                                          // the dialog returned none
        Wide(m_folder.File("missing/a.fxprelb")),     // no such folder
        Wide(m_folder.File("")) + u"\u4E2D.fxprelb",  // not in the code page
        Wide(m_folder.File("")) + u"\u0100.fxprelb",  // only has a best-fit conversion
        Wide(m_folder.File("")) + u"a\u0301.fxprelb",
    };
    for (const std::u16string& name : names) {
        UserChooses(name);
        EXPECT_EQ(Save(&m_library, &m_record), 1);
        EXPECT_EQ(g_user.shown, kSaveShown + kSaveError);
        g_user.shown.clear();
        EXPECT_EQ(Load(&m_library, &m_record), 1);
        EXPECT_EQ(g_user.shown, kOpenShown + kLoadError);
    }
    EXPECT_EQ(m_folder.Count(), 0u) << "no file under another name";
}

TEST_F(PresetSaverTest, NamesTheEffectOfAPresetThatDoesNotFit) {
    PresetRecord damage = tests::MakeRecord(kIndexOfDamage, 0);
    UserChooses(Wide(m_folder.File("a.fxprelc")));
    EXPECT_EQ(m_saver->SavePreset(nullptr, &m_library, kIndexOfDamage, &damage, nullptr), 0);
    g_user.shown.clear();
    EXPECT_EQ(Load(&m_library, &m_record), 2);
    const Shown warning = {
        u"Error trying to open a Film Damage preset. This can only open Film Look presets. Please try again.",
        u"Preset open warning"};
    EXPECT_EQ(g_user.shown, kOpenShown + warning);
    EXPECT_STREQ(m_record.effectName, "Film Damage");
    EXPECT_EQ(m_record.count, damage.count);

    g_user.shown.clear();
    EXPECT_EQ(Load(&m_library, &m_record, nullptr, 5), 2) << "no such effect: nothing to name";
    EXPECT_EQ(g_user.shown.size(), kOpenShown.size());
}

TEST_F(PresetSaverTest, NamesTheSameEffectWhenAParameterDiffers) {
    UserChooses(Wide(m_folder.File("a.fxprelb")));
    PresetRecord other = m_record;
    other.values[3].kind = other.values[3].kind == kKindMenu ? kKindSlider : kKindMenu;
    ASSERT_EQ(Save(&m_library, &other), 0);
    g_user.shown.clear();
    EXPECT_EQ(Load(&m_library, &m_record), 2);
    EXPECT_EQ(g_user.shown.at(5),
              u"Error trying to open a Film Look preset. This can only open Film Look presets. "
              u"Please try again.");
}

// The longest names that a record can hold: 259 characters each.
TEST_F(PresetSaverTest, WarnsOfPresetsWithLongNames) {
    const std::string name(300, 'n');
    UserChooses(Wide(m_folder.Write("a", "<Preset EffectName='" + name + "'><parameter/></Preset>")));
    EXPECT_EQ(Load(&m_library, &m_record), 2);
    EXPECT_EQ(g_user.shown.at(5), u"Error trying to open a " + std::u16string(259, u'n') +
                                      u" preset. This can only open Film Look presets. Please try again.");
}

TEST_F(PresetSaverTest, KeepsTheNamesOfAFileWithoutValues) {
    UserChooses(Wide(m_folder.Write("a", "<Preset Name='x' EffectName='y'/>")));
    EXPECT_EQ(Load(&m_library, &m_record), 1);
    EXPECT_EQ(g_user.shown, kOpenShown + kLoadError);
    EXPECT_STREQ(m_record.name, "x");
    EXPECT_STREQ(m_record.effectName, "y");
    EXPECT_EQ(m_record.count, 0);
    EXPECT_EQ(Load(&m_library, &m_record), 1);

    UserChooses(Wide(m_folder.Write("b", "<Preset")));
    EXPECT_EQ(Load(&m_library, &m_record), 1);
    EXPECT_STREQ(m_record.effectName, "Film Look") << "written before the file was read";
}

TEST_F(PresetSaverTest, WorksWithoutALibrary) {
    std::strcpy(m_record.effectName, "Whatever");
    UserChooses(Wide(m_folder.File("a.prs")));
    EXPECT_EQ(Save(nullptr, &m_record), 0);
    EXPECT_EQ(g_user.shown, (Shown{u"save", u"Save Preset", u"Preset Files (*.prs)", u"*.prs", u"prs"}));
    PresetRecord loaded = {};
    EXPECT_EQ(Load(nullptr, &loaded), 0);
    EXPECT_STREQ(loaded.effectName, "Whatever");
}

TEST_F(PresetSaverTest, SpeaksTheUsersLanguage) {
    FakeTexts texts;
    texts.texts = {{{4, "Save Preset As"}, u"Vorgabe speichern unter"},
                   {{4, "Open Preset"}, u"Vorgabe \u00F6ffnen"},
                   {{4, "Preset Files"}, u"Vorgabedateien"}};
    m_library.texts = &texts;
    struct Case {
        const char* language;
        const char* askedFor;
        std::u16string saveTitle, openTitle, label;
    };
    const Case cases[] = {
        {"de", "de", u"Vorgabe speichern unter", u"Vorgabe \u00F6ffnen", u"Vorgabedateien (*.fxprelb)"},
        {"fr", "fr", u"Save Preset As", u"Open Preset", u"Preset Files (*.fxprelb)"},
        {"deu", "en", u"Save Preset As", u"Open Preset", u"Preset Files (*.fxprelb)"},
    };
    for (const Case& c : cases) {
        g_user = {};
        EXPECT_EQ(Save(&m_library, &m_record, c.language), 0);
        EXPECT_EQ(Load(&m_library, &m_record, c.language), 0);
        EXPECT_EQ(g_user.shown, (Shown{u"save", c.saveTitle, c.label, u"*.fxprelb", u"fxprelb",  //
                                       u"open", c.openTitle, c.label, u"*.fxprelb", u"fxprelb"}));
        EXPECT_EQ(texts.lastLanguage, c.askedFor);
    }
    EXPECT_EQ(texts.references, 0);
    m_library.texts = nullptr;
    g_user = {};
    EXPECT_EQ(Save(&m_library, &m_record, "de"), 0);
    EXPECT_EQ(g_user.shown.at(1), u"Save Preset As");
    g_user = {};
    EXPECT_EQ(Save(nullptr, &m_record, "de"), 0);
    EXPECT_EQ(g_user.shown.at(2), u"Preset Files (*.prs)");
}

TEST(Compatibility, ComparesNamesAndKinds) {
    FakeLibrary library;
    PresetRecord fits = tests::MakeRecord(kIndexOfLook, 0);
    std::strcpy(fits.libraryName, "Velmora Reel Effects");
    std::strcpy(fits.effectName, "Film Look");
    const std::int32_t count = fits.count;
    std::vector<std::uint32_t> kinds;
    kinds.reserve(static_cast<std::size_t>(count));
    for (std::int32_t i = 0; i < count; ++i) kinds.push_back(fits.values[i].kind);

    struct Case {
        const char* name;
        void (*change)(PresetRecord&);
        bool expected;
    };
    const Case cases[] = {
        {"as saved", [](PresetRecord&) {}, true},
        {"more values", [](PresetRecord& r) { r.count = 100; }, true},
        {"fewer values", [](PresetRecord& r) { --r.count; }, false},
        {"no values", [](PresetRecord& r) { r.count = 0; }, false},
        {"negative count", [](PresetRecord& r) { r.count = -1; }, false},
        {"another kind first", [](PresetRecord& r) { r.values[0].kind ^= 8; }, false},
        {"another kind last", [](PresetRecord& r) { r.values[r.count - 1].kind ^= 8; }, false},
        {"another value", [](PresetRecord& r) { r.values[0].value.bits ^= 8; }, true},
        {"library in capitals", [](PresetRecord& r) { r.libraryName[0] = 'v'; }, false},
        {"longer effect name", [](PresetRecord& r) { std::strcat(r.effectName, " "); }, false},
        {"empty effect name", [](PresetRecord& r) { r.effectName[0] = 0; }, false},
        {"name without an end", [](PresetRecord& r) { std::memset(r.effectName, 'F', 260); }, false},
    };
    for (const Case& c : cases) {
        PresetRecord record = fits;
        c.change(record);
        EXPECT_EQ(IsCompatible(&library, kIndexOfLook, &record), c.expected) << c.name;
        EXPECT_EQ(IsCompatible("Velmora Reel Effects", "Film Look", kinds, &record), c.expected) << c.name;
        EXPECT_EQ(IsCompatible(nullptr, kIndexOfLook, &record), record.count > 0) << c.name;
    }
    EXPECT_FALSE(IsCompatible(&library, kIndexOfDamage, &fits));
    EXPECT_FALSE(IsCompatible(&library, 5, &fits));
    EXPECT_FALSE(IsCompatible(&library, kIndexOfLook, nullptr));
    EXPECT_FALSE(IsCompatible(nullptr, kIndexOfLook, nullptr));
}

}  // namespace
}  // namespace velmora

// Presets through the product itself: saved and loaded back by the DLL's own saver and dialogs.
//
// VELMORA_KEEP_PRESETS names a folder: then every preset of every effect is saved there and stays, for other
// hosts to read; otherwise the first of each effect is. VELMORA_READ_PRESETS names a folder of such files, as
// another host may have written them: they are loaded only, and must hold the same.
#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <functional>
#include <thread>

#include "tests/common/library_under_test.h"
#include "tests/presets/dialog_driver.h"
#include "tests/presets/temporary_folder.h"

namespace velmora {
namespace {

using tests::SeenFileDialog;

PresetRecord MakeRecord(IVideoEffect& effect, std::uint32_t preset) {
    PresetRecord record = {};
    std::strncpy(record.name, effect.GetPresetName(preset), sizeof record.name - 1);
    for (std::uint32_t index = 0;; ++index) {
        ParamDescriptor descriptor = {};
        if (!effect.GetParamInfo(index, &descriptor)) return record;
        PresetCell cell = {};
        effect.GetPresetValue(preset, index, &cell);
        record.values[record.count++] = {cell.value, 0, descriptor.kind};
    }
}

void ExpectSameValues(const PresetRecord& expected, const PresetRecord& actual) {
    EXPECT_STREQ(actual.name, expected.name);
    EXPECT_STREQ(actual.effectName, expected.effectName);
    ASSERT_EQ(actual.count, expected.count);
    for (std::int32_t i = 0; i < expected.count; ++i) {
        const ValueCell& cell = expected.values[i];
        EXPECT_EQ(actual.values[i].kind, cell.kind);
        const std::uint32_t mask = cell.kind == kKindGroup      ? 0
                                   : cell.kind == kKindCheckBox ? 0xFF
                                                                : 0xFFFFFFFF;
        EXPECT_EQ(actual.values[i].value.bits & mask, cell.value.bits & mask) << expected.name << ", " << i;
    }
}

class LibraryPresetsTest : public ::testing::Test {
  protected:
    ~LibraryPresetsTest() override {
        m_saver->Release();
        m_library->Release();
    }

    using Operation = std::int32_t (VM_CALL IPresetSaver::*)(void*, IEffectLibrary*, std::uint32_t,
                                                             PresetRecord*, const char*);
    std::int32_t Run(Operation operation, std::uint32_t effect, PresetRecord& record,
                     const std::string& fileName) {
        std::thread user([&] { tests::AnswerFileDialog(fileName, &m_seen); });
        const std::int32_t result = (m_saver->*operation)(nullptr, m_library, effect, &record, nullptr);
        user.join();
        return result;
    }
    PresetRecord BuiltIn(std::uint32_t index, std::uint32_t preset) {
        IVideoEffect* effect = m_library->CreateEffect(index);
        PresetRecord record = MakeRecord(*effect, preset);
        std::strcpy(record.effectName, effect->GetName());
        effect->Release();
        return record;
    }
    void Save(std::uint32_t index, std::uint32_t preset, const std::string& fileName) {
        PresetRecord record = BuiltIn(index, preset);
        ASSERT_EQ(Run(&IPresetSaver::SavePreset, index, record, fileName), 0);
        EXPECT_EQ(m_seen.label,
                  std::wstring(L"Preset Files (*.fxprel") + static_cast<wchar_t>(L'a' + index) + L")");
    }
    void Load(std::uint32_t index, std::uint32_t preset, const std::string& fileName) {
        PresetRecord loaded = {};
        ASSERT_EQ(Run(&IPresetSaver::LoadPreset, index, loaded, fileName), 0);
        ExpectSameValues(BuiltIn(index, preset), loaded);
    }
    bool HasPreset(std::uint32_t index, std::uint32_t preset) {
        IVideoEffect* effect = m_library->CreateEffect(index);
        const bool has = effect->GetPresetName(preset) != nullptr;
        effect->Release();
        return has;
    }

    velmora::testing::LoadedLibrary m_module;
    IEffectLibrary* m_library = m_module.getEffectsLibrary();
    IPresetSaver* m_saver = m_library->CreatePresetSaver();
    SeenFileDialog m_seen;
};

TEST_F(LibraryPresetsTest, ComeBackBitForBit) {
    const tests::TemporaryFolder temporary;
    const char* keep = std::getenv("VELMORA_KEEP_PRESETS");
    const char* read = std::getenv("VELMORA_READ_PRESETS");
    const bool isAll = keep != nullptr || read != nullptr;
    const std::string folder = read != nullptr ? read : keep != nullptr ? keep : temporary.Path().string();
    for (std::uint32_t index = 0; index < 5; ++index) {
        for (std::uint32_t preset = 0; HasPreset(index, preset) && (isAll || preset == 0); ++preset) {
            const std::string name = folder + "\\" + std::to_string(index) + "-" + std::to_string(preset) +
                                     ".fxprel" + static_cast<char>('a' + index);
            if (read == nullptr) Save(index, preset, name);
            Load(index, preset, name);
        }
    }
}

// Shows the save dialog in the language VELMORA_LANGUAGE for some seconds, for the pictures in docs/pictures.
TEST_F(LibraryPresetsTest, DISABLED_ShowsItsSaveDialog) {
    const char* language = std::getenv("VELMORA_LANGUAGE");
    PresetRecord record = {};
    std::thread user([] {
        HWND dialog = tests::WaitForFileDialog();
        Sleep(8000);
        tests::Press(dialog, IDCANCEL);
    });
    EXPECT_EQ(m_saver->SavePreset(nullptr, m_library, 1, &record, language), 0);
    user.join();
}

}  // namespace
}  // namespace velmora

#include "user_presets/preset_saver.h"

#include <algorithm>
#include <cstring>
#include <new>
#include <string_view>

#include "api/reference.h"
#include "platform/float_guard.h"
#include "user_presets/preset_file.h"
#include "user_presets/dialogs.h"
#include "text/encodings.h"
#include "text/strings.h"

namespace velmora {

namespace {

enum Result : std::int32_t {
    kDone = 0,
    kFailed = 1,
    kOtherEffect = 2,  // LoadPreset only
};

using ShowFileDialog = bool (*)(const FileDialog&, DialogFileName&) noexcept;

// What saving and loading have in common.
struct Flow {
    ShowFileDialog show;
    const char16_t* plainTitle;
    const char* titleKey;
};
constexpr Flow kSaveFlow = {ShowSaveDialog, u"Save Preset", "Save Preset As"};
constexpr Flow kLoadFlow = {ShowOpenDialog, u"Load Preset", "Open Preset"};

// False when the user cancelled. A language code selects the translated texts.
bool AskForFile(const Flow& flow, void* owner, IEffectLibrary* library, std::uint32_t effectIndex,
                const char* languageCode, TranslationHelper& translation, DialogFileName& fileName) {
    const char* libraryName = library != nullptr ? library->GetLibraryName() : nullptr;
    const char16_t* labelWord = nullptr;
    if (languageCode != nullptr) {
        translation.SetContext(library, languageCode);
        labelWord = translation.Translate(kTextsOfPresets, "Preset Files");
    }
    // Copies the label, which the next lookup overwrites.
    const PresetFilter filter = MakePresetFilter(libraryName, effectIndex, labelWord);
    const PresetExtension extension = MakePresetExtension(libraryName, effectIndex);
    const char16_t* title =
        languageCode != nullptr ? translation.Translate(kTextsOfPresets, flow.titleKey) : flow.plainTitle;
    return flow.show({owner, title, filter.data(), extension.data()}, fileName);
}

void CopyName(char (&field)[kPresetNameWidth], const char* name) {
    const std::size_t length = name != nullptr ? std::min(std::strlen(name), sizeof field - 1) : 0;
    if (length != 0) std::memcpy(field, name, length);
    std::memset(field + length, 0, sizeof field - length);
}

// Returns the effect after storing its name and the library's in the record; empty when there is none.
Reference<IVideoEffect> TakeEffect(IEffectLibrary* library, std::uint32_t effectIndex, PresetRecord& record) {
    if (library == nullptr) return {};
    auto effect = Reference<IVideoEffect>::Adopt(library->CreateEffect(effectIndex));
    if (!effect) return {};
    CopyName(record.libraryName, library->GetLibraryName());
    CopyName(record.effectName, effect->GetName());
    return effect;
}

bool Save(const DialogFileName& fileName, const PresetRecord& record) {
    char name[std::tuple_size_v<DialogFileName>];
    return NarrowFileName(fileName.data(), name, sizeof name) && WritePreset(name, &record);
}

Result Load(const DialogFileName& fileName, IEffectLibrary* library, std::uint32_t effectIndex,
            PresetRecord& record) {
    char name[std::tuple_size_v<DialogFileName>];
    if (!NarrowFileName(fileName.data(), name, sizeof name) || !ReadPreset(name, &record)) return kFailed;
    return IsCompatible(library, effectIndex, &record) ? kDone : kOtherEffect;
}

void WarnOfOtherEffect(const char* presetEffect, const char* ownEffect) {
    constexpr std::size_t kCapacity = 1024;
    const VMUnicodeString presetName = VMString(presetEffect, kMeasureText).ToUnicode();
    const VMUnicodeString ownName = VMString(ownEffect, kMeasureText).ToUnicode();
    const std::u16string_view pieces[] = {
        u"Error trying to open a ",      {presetName.Text(), presetName.Length()},
        u" preset. This can only open ", {ownName.Text(), ownName.Length()},
        u" presets. Please try again.",
    };
    char16_t text[kCapacity] = {};
    std::size_t length = 0;
    for (const std::u16string_view piece : pieces) {
        length += piece.copy(text + length, kCapacity - 1 - length);
    }
    ShowWarning(text, u"Preset open warning");
}

}  // namespace

IPresetSaver* CreatePresetSaver() noexcept {
    return new (std::nothrow) CPresetSaver;
}

CPresetSaver::~CPresetSaver() = default;

Status VM_CALL CPresetSaver::QueryInterface(const Guid* iid, void** out) {
    auto* saver = static_cast<IPresetSaver*>(this);
    const Status status = FindInterface({{&kIidUnknown, saver}, {&kIidPresetSaver, saver}}, iid, out);
    if (status == kStatusOk) m_references.Add();
    return status;
}

std::uint32_t VM_CALL CPresetSaver::AddRef() {
    return m_references.Add();
}

std::uint32_t VM_CALL CPresetSaver::Release() {
    const std::uint32_t left = m_references.Drop();
    if (left != 0) return left;
    const FloatGuard guard;
    delete this;
    return 0;
}

std::int32_t VM_CALL CPresetSaver::SavePreset(void* owner, IEffectLibrary* library, std::uint32_t effectIndex,
                                              PresetRecord* record, const char* languageCode) {
    const FloatGuard guard;
    bool isSaved = false;
    if (record != nullptr) {
        DialogFileName fileName = {};
        if (!AskForFile(kSaveFlow, owner, library, effectIndex, languageCode, m_translation, fileName)) {
            return kDone;
        }
        if (fileName[0] != 0) {
            static_cast<void>(TakeEffect(library, effectIndex, *record));
            isSaved = Save(fileName, *record);
        }
    }
    if (isSaved) return kDone;
    ShowWarning(u"Sorry, can't save preset.\nPossible reason: access denied or disk is full.",
                u"Preset save error");
    return kFailed;
}

std::int32_t VM_CALL CPresetSaver::LoadPreset(void* owner, IEffectLibrary* library, std::uint32_t effectIndex,
                                              PresetRecord* record, const char* languageCode) {
    const FloatGuard guard;
    Result result = kFailed;
    Reference<IVideoEffect> effect;
    if (record != nullptr) {
        DialogFileName fileName = {};
        if (!AskForFile(kLoadFlow, owner, library, effectIndex, languageCode, m_translation, fileName)) {
            return kDone;
        }
        if (fileName[0] != 0) {
            effect = TakeEffect(library, effectIndex, *record);
            result = Load(fileName, library, effectIndex, *record);
        }
    }
    if (result == kFailed) {
        ShowWarning(
            u"Sorry, can't open the preset specified.\nPossible reason: access denied or file is corrupted.",
            u"Preset load error");
    } else if (result == kOtherEffect && effect) {
        WarnOfOtherEffect(record->effectName, effect->GetName());
    }
    return result;
}

}  // namespace velmora

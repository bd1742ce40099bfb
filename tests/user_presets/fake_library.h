// A library as the preset saver sees one: the real effects, and translated texts when a test wants them.
#pragma once

#include <algorithm>
#include <map>
#include <string>

#include "effects/film_effect.h"
#include "api/com_object.h"
#include "api/host_api.h"
#include "api/reference.h"

namespace velmora::tests {

// Answers one language; counts what is acquired and released.
class FakeTexts final : public Uncounted<IMultiLingual> {
  public:
    std::uint32_t VM_CALL AddRef() override { return static_cast<std::uint32_t>(++references); }
    std::uint32_t VM_CALL Release() override { return static_cast<std::uint32_t>(--references); }
    std::int32_t VM_CALL LookUpText(const char*, std::int32_t, const char*, const char16_t*, char16_t*,
                                    std::int32_t, std::int32_t*) override {
        return 0;
    }
    std::int32_t VM_CALL GetText(const char* languageCode, std::int32_t category, const char* key,
                                 char16_t* buffer, std::int32_t capacity) override {
        lastLanguage = languageCode;
        lastCapacity = capacity;
        if (key == nullptr || language != languageCode) return 0;
        const auto found = texts.find({category, key});
        if (found == texts.end()) return 0;
        const auto length = std::min(found->second.size(), static_cast<std::size_t>(capacity) - 1);
        std::copy_n(found->second.data(), length, buffer);
        buffer[length] = 0;
        return static_cast<std::int32_t>(length);
    }

    std::string language = "de";
    std::map<std::pair<std::int32_t, std::string>, std::u16string> texts;
    std::string lastLanguage;
    std::int32_t lastCapacity = 0;
    int references = 0;
};

class FakeLibrary final : public Uncounted<IEffectLibrary> {
  public:
    Status VM_CALL QueryInterface(const Guid* iid, void** out) override {
        *out = nullptr;
        if (texts == nullptr || !SameId(iid, kIidMultiLingual)) return kStatusNoInterface;
        ++texts->references;
        *out = static_cast<IMultiLingual*>(texts);
        return kStatusOk;
    }
    const char* VM_CALL GetLibraryName() override { return name; }
    IVideoEffect* VM_CALL CreateEffect(std::uint32_t index) override {
        return effects::CreateEffectByIndex(index);
    }
    std::int32_t VM_CALL ShowHelp(void*, std::int32_t) override { return 0; }
    IShellServices* VM_CALL GetShellServices() override { return nullptr; }
    IFrameProcessor* VM_CALL CreateFrameProcessor() override { return nullptr; }
    IPresetSaver* VM_CALL CreatePresetSaver() override { return nullptr; }

    const char* name = "Velmora Reel Effects";
    FakeTexts* texts = nullptr;
};

inline constexpr std::uint32_t kIndexOfLook = 1;
inline constexpr std::uint32_t kIndexOfDamage = 2;

// What a host passes to the saver: the effect's built-in preset `preset` in value cells. The saver fills in all names
// but the preset's own.
inline PresetRecord MakeRecord(std::uint32_t effectIndex, std::uint32_t preset) {
    PresetRecord record = {};
    const auto effect = Reference<IVideoEffect>::Adopt(effects::CreateEffectByIndex(effectIndex));
    const char* name = effect->GetPresetName(preset);
    std::copy_n(name, std::min<std::size_t>(std::char_traits<char>::length(name), 259), record.name);
    ParamDescriptor descriptor = {};
    for (std::uint32_t index = 0; effect->GetParamInfo(index, &descriptor); ++index) {
        PresetCell cell = {};
        effect->GetPresetValue(preset, index, &cell);
        record.values[record.count++] = {cell.value, 0, descriptor.kind};
        descriptor = {};
    }
    return record;
}

}  // namespace velmora::tests

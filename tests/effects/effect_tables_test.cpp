// Everything that effects report to hosts, written out and compared with effects.txt: every descriptor byte, every
// preset cell and the answer to each of the renderer's settings.

#include <gtest/gtest.h>

#include <charconv>
#include <cstring>
#include <sstream>
#include <string>

#include "effects/film_effect.h"
#include "tests/effects/test_hosts.h"

namespace velmora::tests {
namespace {

constexpr char kEffectsText[] =
#include "effects_text.inc"
    ;

// A value formatted by its kind; numbers with the fewest digits that identify them.
std::string Shown(std::uint32_t kind, ValueWord value) {
    char text[32] = "";
    switch (kind) {
        case kKindSlider:
            return {text, std::to_chars(text, std::end(text), value.number).ptr};
        case kKindMenu:
        case kKindCheckBox:
            return std::to_string(value.bits);
        default:
            std::snprintf(text, sizeof text, "0x%08X", value.bits);
            return text;
    }
}

// The byte ranges that an effect writes: those that come out the same whatever was there before.
std::string WrittenBytes(IVideoEffect& effect, std::uint32_t index) {
    std::uint8_t low[sizeof(ParamDescriptor) + 1], high[sizeof low];
    std::memset(low, 0x00, sizeof low);
    std::memset(high, 0xFF, sizeof high);
    effect.GetParamInfo(index, reinterpret_cast<ParamDescriptor*>(low));
    effect.GetParamInfo(index, reinterpret_cast<ParamDescriptor*>(high));
    std::ostringstream ranges;
    for (std::size_t i = 0; i < sizeof low; ++i) {
        const bool isWritten = low[i] == high[i], wasWritten = i > 0 && low[i - 1] == high[i - 1];
        if (isWritten && !wasWritten) ranges << ' ' << i;
        if (!isWritten && wasWritten) ranges << '-' << i - 1;
    }
    return ranges.str();
}

void WriteParam(const ParamDescriptor& param, std::ostream& out) {
    static constexpr const char* kKinds[] = {"none", "menu", "slider", "colour", "check", "group"};
    out << kKinds[param.kind] << " | " << param.name << " | ";
    if (param.kind == kKindGroup) {
        out << (param.minimum.flag == 0 ? "begin" : "end");
    } else {
        out << Shown(param.kind, param.defaultValue);
    }
    if (param.kind == kKindSlider) {
        out << " | " << param.minimum.number << ".." << param.slider.maximum.number;
        if (param.slider.afterMaximum != 0) out << " mark " << param.slider.afterMaximum;
    }
    if (param.kind == kKindMenu) {
        out << " |";
        for (std::uint32_t i = 0; i < param.minimum.count; ++i) out << ' ' << param.itemTexts[i];
    }
    out << " | " << param.x << ' ' << param.y << ' ' << param.width << ' ' << param.height << " |";
}

// How the effect's host interface answers a setting, whose kind the renderer names.
std::string Answer(IVideoEffect& effect, std::uint32_t setting, std::uint32_t kind) {
    static constexpr const char* kKinds[] = {"", "item ", "number ", "colour ", "flag "};
    RecordingHost host;
    effect.Process(&host, nullptr, nullptr, nullptr, nullptr);
    void* found = nullptr;
    effect.QueryInterface(&kIidVideoHost, &found);
    ValueCell cell = {{.bits = 0xCCCCCCCCu}, 0xCCCCCCCCu, 0xCCCCCCCCu};
    const bool isAnswered = static_cast<IVideoHost*>(found)->GetParamValue(setting, &cell, kind);
    effect.Release();
    if (!isAnswered || cell.kind != kind || cell.second != 0xCCCCCCCCu) return "none";
    if (host.calls.empty()) {
        if (kind == kKindCheckBox)
            cell.value.bits ^= 0xCCCCCC00u;  // only the first byte of a flag is written
        return kKinds[kind] + Shown(kind, cell.value);
    }
    if (host.calls != std::vector<RecordingHost::Call>{{host.calls[0].index, kind}}) return "asks for more";
    const std::uint32_t own = host.calls[0].index;
    return (cell.value.bits == RecordingHost::WordOf(own) ? "own " : "depth ") + std::to_string(own);
}

void WriteEffect(IVideoEffect& effect, std::ostream& out) {
    static constexpr std::uint32_t kSettingKinds[] = {2, 2, 3, 2, 2, 2, 2, 2, 3, 2, 2,
                                                      2, 2, 1, 4, 2, 2, 2, 4, 4, 4};
    out << "\neffect " << effect.GetName() << '\n';
    std::vector<std::uint32_t> kinds;
    for (ParamDescriptor param = {}; effect.GetParamInfo(static_cast<std::uint32_t>(kinds.size()), &param);
         param = {}) {
        WriteParam(param, out);
        out << WrittenBytes(effect, static_cast<std::uint32_t>(kinds.size())) << '\n';
        kinds.push_back(param.kind);
    }
    for (std::uint32_t preset = 0; effect.GetPresetName(preset) != nullptr; ++preset) {
        out << "preset | " << effect.GetPresetName(preset) << " |";
        PresetCell cell = {};
        for (std::uint32_t i = 0; effect.GetPresetValue(preset, i, &cell); ++i) {
            out << ' ' << (i < kinds.size() ? Shown(kinds[i], cell.value) : "more");
        }
        out << '\n';
    }
    out << "answers";
    for (std::uint32_t i = 0; i < std::size(kSettingKinds); ++i) {
        out << " | " << Answer(effect, i, kSettingKinds[i]);
    }
    out << '\n';
}

TEST(EffectTables, AreWhatTheTextSays) {
    std::ostringstream shown;
    std::uint32_t count = 0;
    for (; IVideoEffect* const effect = effects::CreateEffectByIndex(count); ++count) {
        WriteEffect(*effect, shown);
        EXPECT_EQ(effect->Release(), 0u);
    }
    EXPECT_EQ(count, 5u);
    const std::string text = kEffectsText;
    EXPECT_EQ(shown.str(), text.substr(text.find("\n\neffect ") + 1));
}

}  // namespace
}  // namespace velmora::tests

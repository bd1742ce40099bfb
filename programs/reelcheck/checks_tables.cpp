// What effects report about themselves: descriptors and presets.

#include <algorithm>
#include <cmath>
#include <cstring>
#include <set>

#include "programs/reelcheck/checks.h"
#include "programs/reelcheck/system.h"
#include "programs/reelcheck/library.h"
#include "programs/reelcheck/playing_host.h"

namespace velmora::reelcheck {
namespace {

bool IsUnit(float value) noexcept {
    return value >= 0.0f && value <= 1.0f;
}

void CheckMenuItems(const ParamDescriptor& param) {
    Require(param.minimum.count >= 1 && param.minimum.count <= static_cast<std::uint32_t>(kMenuItemCapacity),
            "a menu with no items, or too many");
    for (std::uint32_t i = 0; i < param.minimum.count; ++i) {
        Require(param.itemTexts[i][0] != 0, "a menu item without a text");
    }
}

// The value is valid for the parameter; a default, or a preset's.
void RequireFits(const ParamDescriptor& param, ValueWord value) {
    switch (param.kind) {
        case kKindSlider:
            Require(IsUnit(value.number), "a slider's value outside 0..1");
            break;
        case kKindMenu:
            Require(value.bits < param.minimum.count, "a menu's value after its last item");
            break;
        case kKindCheckBox:
            Require(value.flag <= 1, "a check box that is neither on nor off");
            break;
        default:
            break;
    }
}

void CheckParam(const ParamDescriptor& param) {
    Require(param.kind >= kKindMenu && param.kind <= kKindGroup, "a kind that does not exist");
    Require(param.visible == 1 && param.second == 0, "a field has a value of its own");
    if (param.kind == kKindGroup) {
        Require(param.minimum.flag <= 1, "a group marker that neither begins nor ends");
        return;
    }
    Require(param.name[0] != 0, "a parameter without a name");
    if (param.kind == kKindSlider) {
        Require(std::isfinite(param.minimum.number) && std::isfinite(param.slider.maximum.number) &&
                    param.minimum.number < param.slider.maximum.number,
                "a slider without a range");
    }
    if (param.kind == kKindMenu) CheckMenuItems(param);
    RequireFits(param, param.defaultValue);
}

// Groups are balanced, whatever they contain.
void CheckGroups(const EffectFacts& facts) {
    int depth = 0;
    for (const ParamDescriptor& param : facts.params) {
        if (param.kind == kKindGroup) depth += param.minimum.flag == 0 ? 1 : -1;
        Require(depth >= 0, "a group ends that has not begun");
    }
    Require(depth == 0, "a group does not end");
}

// A descriptor in exactly its own size of memory, at either edge; fields that an effect does not write keep their
// value.
void CheckRecordEdges(IVideoEffect& effect, std::uint32_t count) {
    for (const Edge edge : {Edge::kFront, Edge::kBack}) {
        const GuardedMemory memory(sizeof(ParamDescriptor), edge);
        auto* const descriptor = reinterpret_cast<ParamDescriptor*>(memory.Data());
        for (std::uint32_t i = 0; i < count; ++i) {
            Require(effect.GetParamInfo(i, descriptor), "a parameter is gone when asked again");
        }
        std::memset(memory.Data(), 0x5A, memory.Size());
        for (const std::uint32_t index : {count, count + 1, 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFFFu}) {
            Require(!effect.GetParamInfo(index, descriptor), "a parameter after the last");
            Require(std::all_of(memory.Data(), memory.Data() + memory.Size(),
                                [](std::uint8_t byte) { return byte == 0x5A; }),
                    "a parameter after the last writes its record");
        }
    }
}

void CheckPresetValues(IVideoEffect& effect, const EffectFacts& facts, std::uint32_t preset) {
    const auto count = static_cast<std::uint32_t>(facts.params.size());
    const GuardedMemory memory(sizeof(PresetCell), Edge::kBack);
    auto* const cell = reinterpret_cast<PresetCell*>(memory.Data());
    for (std::uint32_t i = 0; i < count; ++i) {
        SetPlace("%s, preset %s, parameter %u", facts.name.c_str(), facts.presets[preset].c_str(), i);
        Require(effect.GetPresetValue(preset, i, cell), "has no value");
        Require(cell->second == 0, "the second word is not 0");
        RequireFits(facts.params[i], cell->value);
    }
    Require(!effect.GetPresetValue(preset, count, cell) && !effect.GetPresetValue(preset, 0xFFFFFFFFu, cell),
            "a preset has a value for a parameter that does not exist");
}

}  // namespace

void CheckDescriptions(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    for (std::uint32_t index = 0; index < kEffectCount; ++index) {
        const Reference<IVideoEffect> effect = library.Effect(index);
        const EffectFacts facts = EffectFacts::Of(*effect);
        SetPlace("%s", facts.name.c_str());
        Require(effect->GetKind() == 1, "another kind of effect");
        Require(!facts.params.empty() && facts.params.size() <= PlayingHost::kCapacity,
                "no parameters, or more than a preset file holds");
        for (const ParamDescriptor& param : facts.params) {
            SetPlace("%s, %s", facts.name.c_str(), ParamName(param).c_str());
            CheckParam(param);
        }
        SetPlace("%s", facts.name.c_str());
        CheckGroups(facts);
        CheckRecordEdges(*effect, static_cast<std::uint32_t>(facts.params.size()));
    }
}

void CheckPresets(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    for (std::uint32_t index = 0; index < kEffectCount; ++index) {
        const Reference<IVideoEffect> effect = library.Effect(index);
        const EffectFacts facts = EffectFacts::Of(*effect);
        SetPlace("%s", facts.name.c_str());
        static_cast<void>(facts.Preset("Reset To None"));
        const std::set<std::string> names(facts.presets.begin(), facts.presets.end());
        Require(names.size() == facts.presets.size() && !names.contains(""), "preset names are not unique");
        const auto count = static_cast<std::uint32_t>(facts.presets.size());
        for (std::uint32_t i = 0; i < count; ++i) CheckPresetValues(*effect, facts, i);
        SetPlace("%s", facts.name.c_str());
        PresetCell cell = {};
        for (const std::uint32_t behind : {count, count + 1, 0x80000000u, 0xFFFFFFFFu}) {
            Require(effect->GetPresetName(behind) == nullptr && !effect->GetPresetValue(behind, 0, &cell),
                    "a preset after the last");
        }
    }
}

}  // namespace velmora::reelcheck

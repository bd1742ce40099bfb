#include "programs/reelcheck/playing_host.h"

#include <algorithm>
#include <cstring>
#include <limits>

#include "programs/reelcheck/check.h"

namespace velmora::reelcheck {
namespace {

constexpr std::uint32_t kMostParams = 1000;  // an effect that never says "no more" would never end

// What a careless host may send for a slider.
constexpr float kHostileNumbers[] = {
    0.0f,
    -0.0f,
    1.0f,
    0.5f,
    -1.0f,
    2.0f,
    100.0f,
    -1e30f,
    1e30f,
    std::numeric_limits<float>::max(),
    std::numeric_limits<float>::lowest(),
    std::numeric_limits<float>::min(),
    std::numeric_limits<float>::denorm_min(),
    std::numeric_limits<float>::infinity(),
    -std::numeric_limits<float>::infinity(),
    std::numeric_limits<float>::quiet_NaN(),
    std::numeric_limits<float>::signaling_NaN(),
    0.99999994f,
    1.0000001f,
};

constexpr std::int32_t kHostileItems[] = {0, 6, 7, 8, 9, 10, 255, -1, -2, 2000, 0x7FFFFFFF, -0x7FFFFFFF - 1};

template <typename Value, std::size_t kCount>
Value OneOf(const Value (&values)[kCount], Dice& dice) noexcept {
    return values[dice.Between(0, static_cast<std::int32_t>(kCount) - 1)];
}

ValueWord FairWord(const ParamDescriptor& param, Dice& dice) noexcept {
    ValueWord word = {};
    switch (param.kind) {
        case kKindSlider:
            word.number = dice.OneIn(4) ? static_cast<float>(dice.Between(0, 1)) : dice.Unit();
            break;
        case kKindMenu:
            word.item = dice.Between(0, std::max(0, static_cast<std::int32_t>(param.minimum.count) - 1));
            break;
        case kKindCheckBox:
            word.flag = static_cast<std::uint8_t>(dice.Between(0, 1));
            break;
        default:
            word.colour = dice.Word() & 0x00FFFFFF;
    }
    return word;
}

ValueWord HostileWord(const ParamDescriptor& param, Dice& dice) noexcept {
    ValueWord word = {};
    word.bits = dice.Word();
    if (param.kind == kKindSlider && !dice.OneIn(4)) word.number = OneOf(kHostileNumbers, dice);
    if (param.kind == kKindMenu && !dice.OneIn(4)) word.item = OneOf(kHostileItems, dice);
    return word;
}

// Truncating, single precision, denormals flushed.
void SpoilRounding() noexcept {
    const std::uint16_t x87Control = 0x0C7F;
    const std::uint32_t vectorControl = 0xFFC0;
    __asm__ __volatile__("fldcw %0\n\tldmxcsr %1" : : "m"(x87Control), "m"(vectorControl));
}

}  // namespace

bool VM_CALL PlayingHost::GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) {
    ++questions;
    if (spoilsRounding) SpoilRounding();
    if (!answers || index >= kCapacity || cell == nullptr) return false;
    cell->value = values[index];
    cell->kind = kind;
    return true;
}

EffectFacts EffectFacts::Of(IVideoEffect& effect) {
    EffectFacts facts;
    facts.name = effect.GetName();
    ParamDescriptor descriptor = {};
    while (facts.params.size() < kMostParams &&
           effect.GetParamInfo(static_cast<std::uint32_t>(facts.params.size()), &descriptor)) {
        facts.params.push_back(descriptor);
        descriptor = {};
    }
    while (facts.presets.size() < kMostParams) {
        const char* const name = effect.GetPresetName(static_cast<std::uint32_t>(facts.presets.size()));
        if (name == nullptr) break;
        facts.presets.emplace_back(name);
    }
    return facts;
}

std::uint32_t EffectFacts::Preset(const char* wanted) const {
    const auto found = std::ranges::find(presets, wanted);
    if (found == presets.end()) Fail(Text("%s has no preset %s", name.c_str(), wanted));
    return static_cast<std::uint32_t>(found - presets.begin());
}

std::string ParamName(const ParamDescriptor& descriptor) {
    return {descriptor.name, std::find(descriptor.name, descriptor.name + kParamNameWidth, '\0')};
}

void ChoosePreset(PlayingHost& host, IVideoEffect& effect, std::uint32_t preset) {
    PresetCell cell = {};
    for (std::uint32_t i = 0; i < PlayingHost::kCapacity && effect.GetPresetValue(preset, i, &cell); ++i) {
        host.values[i] = cell.value;
    }
}

void ChooseFair(PlayingHost& host, const EffectFacts& facts, Dice& dice) {
    for (std::size_t i = 0; i < facts.params.size(); ++i) host.values[i] = FairWord(facts.params[i], dice);
}

void ChooseHostile(PlayingHost& host, const EffectFacts& facts, Dice& dice) {
    for (std::size_t i = 0; i < facts.params.size(); ++i) host.values[i] = HostileWord(facts.params[i], dice);
}

void ChooseFull(PlayingHost& host, const EffectFacts& facts) {
    for (std::size_t i = 0; i < facts.params.size(); ++i) {
        ValueWord& value = host.values[i];
        value = {};
        if (facts.params[i].kind == kKindSlider) value.number = 1.0f;
        if (facts.params[i].kind == kKindCheckBox) value.flag = 1;
        if (facts.params[i].kind == kKindColour) value.colour = 0x00336699;
    }
}

bool Process(IVideoEffect& effect, IVideoHost* host, const FrameRecord& source,
             const FrameRecord& destination, double seconds) {
    const TimingRecord timing = {-1.0, -1.0, seconds};
    return effect.Process(host, &source, nullptr, &destination, &timing);
}

void RenderInside(IVideoEffect& effect, IVideoHost& host, const Frame& source, Frame& destination,
                  double seconds) {
    constexpr std::uint8_t kOutside = 0xA5;
    destination.Fill(kOutside);
    Require(Process(effect, &host, source.Record(), destination.Record(), seconds),
            "the effect refuses the frame");
    const std::int32_t width = std::min(source.Shape().width, destination.Shape().width);
    const std::int32_t height = std::min(source.Shape().height, destination.Shape().height);
    Require(destination.OnlyInside(width, height, kOutside),
            "something outside the processed rectangle is written");
}

}  // namespace velmora::reelcheck

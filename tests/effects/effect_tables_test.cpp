// What hosts are told of the effects: every descriptor byte and every preset cell, against effects.txt.

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "effects/film_effect.h"
#include "tests/effects/expected_effects.h"

namespace velmora::tests {
namespace {

using effects::CreateEffectByIndex;

constexpr std::uint8_t kUntouched = 0xCC;

// A descriptor as bytes: independent of how the record is declared.
class DescriptorImage {
  public:
    DescriptorImage() { std::memset(m_bytes, kUntouched, sizeof m_bytes); }

    void PutWord(std::size_t offset, std::uint32_t word) { std::memcpy(m_bytes + offset, &word, 4); }
    void PutByte(std::size_t offset, std::uint8_t byte) { m_bytes[offset] = byte; }
    void PutText(std::size_t offset, const std::string& text) {
        std::memcpy(m_bytes + offset, text.c_str(), text.size() + 1);
    }
    const std::uint8_t* Bytes() const { return m_bytes; }

  private:
    std::uint8_t m_bytes[sizeof(ParamDescriptor)];
};

void PutValueFields(const ExpectedParam& param, bool marksSliders, DescriptorImage& image) {
    switch (param.kind) {
        case kKindSlider:
            image.PutWord(0, StoredWord(param, param.defaultShown));
            image.PutWord(12, FloatBits(static_cast<float>(param.minimum)));
            image.PutWord(16, FloatBits(static_cast<float>(param.maximum)));
            if (marksSliders) image.PutWord(20, 1);
            break;
        case kKindColour:
            image.PutWord(0, StoredWord(param, param.defaultShown));
            break;
        case kKindCheckBox:
            image.PutByte(0, param.defaultShown == "on" ? 1 : 0);
            break;
        case kKindMenu: {
            const char* const items[] = {"Wavy", "Blotchy", "Grainy", "Fine", "Splotchy", "Lite", "Crackly"};
            image.PutWord(0, StoredWord(param, param.defaultShown));
            image.PutWord(12, 7);
            for (std::size_t i = 0; i < 7; ++i) image.PutText(16 + 20 * i, items[i]);
            break;
        }
        case kKindGroup:
            image.PutByte(12, param.isGroupEnd ? 1 : 0);
            break;
        default:
            FAIL();
    }
}

DescriptorImage ImageOf(const ExpectedParam& param, bool marksSliders) {
    DescriptorImage image;
    PutValueFields(param, marksSliders, image);
    image.PutWord(8, param.kind);
    image.PutText(216, param.name);
    for (std::size_t i = 0; i < 4; ++i) {
        image.PutWord(256 + 4 * i, static_cast<std::uint32_t>(param.layout[i]));
    }
    image.PutWord(272, 1);
    return image;
}

// A record between guards, all of it untouched.
struct GuardedDescriptor {
    std::uint8_t before[16];
    ParamDescriptor descriptor;
    std::uint8_t after[16];

    GuardedDescriptor() { std::memset(this, kUntouched, sizeof *this); }
    void ExpectGuards() const {
        for (const std::uint8_t byte : before) EXPECT_EQ(byte, kUntouched);
        for (const std::uint8_t byte : after) EXPECT_EQ(byte, kUntouched);
    }
    void ExpectBytes(const DescriptorImage& expected) const {
        std::uint8_t bytes[sizeof descriptor];
        std::memcpy(bytes, &descriptor, sizeof bytes);
        for (std::size_t i = 0; i < sizeof bytes; ++i) {
            ASSERT_EQ(bytes[i], expected.Bytes()[i]) << "at offset " << i;
        }
    }
};

// Runs the check for each effect object together with what it is expected to show.
template <typename Check>
void ForEachEffect(Check&& check) {
    std::uint32_t index = 0;
    for (const ExpectedEffect& expected : ExpectedEffects()) {
        SCOPED_TRACE(expected.name);
        IVideoEffect* effect = CreateEffectByIndex(index++);
        ASSERT_NE(effect, nullptr);
        check(*effect, expected);
        EXPECT_EQ(effect->Release(), 0u);
    }
}

TEST(EffectTables, FiveEffectsWithTheirSizes) {
    struct Size {
        const char* name;
        std::uint32_t params, presets;
    };
    const Size sizes[] = {{"Film Camera", 5, 8},
                          {"Film Look", 7, 30},
                          {"Film Damage", 11, 8},
                          {"Film Express", 15, 11},
                          {"Film Pro", 27, 24}};
    for (std::uint32_t i = 0; i < 5; ++i) {
        SCOPED_TRACE(sizes[i].name);
        IVideoEffect* effect = CreateEffectByIndex(i);
        ASSERT_NE(effect, nullptr);
        EXPECT_STREQ(effect->GetName(), sizes[i].name);
        EXPECT_EQ(effect->GetKind(), 1);
        ParamDescriptor descriptor;
        PresetCell cell;
        EXPECT_TRUE(effect->GetParamInfo(sizes[i].params - 1, &descriptor));
        EXPECT_FALSE(effect->GetParamInfo(sizes[i].params, &descriptor));
        EXPECT_NE(effect->GetPresetName(sizes[i].presets - 1), nullptr);
        EXPECT_EQ(effect->GetPresetName(sizes[i].presets), nullptr);
        EXPECT_TRUE(effect->GetPresetValue(sizes[i].presets - 1, sizes[i].params - 1, &cell));
        EXPECT_FALSE(effect->GetPresetValue(sizes[i].presets, 0, &cell));
        EXPECT_FALSE(effect->GetPresetValue(0, sizes[i].params, &cell));
        EXPECT_FALSE(effect->GetPresetValue(0, 0, nullptr));
        effect->Release();
    }
    EXPECT_EQ(CreateEffectByIndex(5), nullptr);
    EXPECT_EQ(CreateEffectByIndex(0xFFFFFFFFu), nullptr);
}

TEST(EffectTables, DescriptorsWriteTheirFieldsAndNothingElse) {
    ForEachEffect([](IVideoEffect& effect, const ExpectedEffect& expected) {
        for (std::uint32_t i = 0; i < expected.params.size(); ++i) {
            SCOPED_TRACE(expected.params[i].name + ", parameter " + std::to_string(i));
            GuardedDescriptor record;
            ASSERT_TRUE(effect.GetParamInfo(i, &record.descriptor));
            record.ExpectBytes(ImageOf(expected.params[i], expected.name == "Film Damage"));
            record.ExpectGuards();
        }
    });
}

TEST(EffectTables, NoDescriptorPastTheEnd) {
    ForEachEffect([](IVideoEffect& effect, const ExpectedEffect& expected) {
        for (const std::uint32_t index : {static_cast<std::uint32_t>(expected.params.size()), 0xFFFFFFFFu}) {
            GuardedDescriptor record;
            EXPECT_FALSE(effect.GetParamInfo(index, &record.descriptor));
            record.ExpectBytes(DescriptorImage());
        }
        EXPECT_FALSE(effect.GetParamInfo(0, nullptr));
    });
}

TEST(EffectTables, PresetsCellByCell) {
    ForEachEffect([](IVideoEffect& effect, const ExpectedEffect& expected) {
        for (std::uint32_t preset = 0; preset < expected.presets.size(); ++preset) {
            const ExpectedPreset& row = expected.presets[preset];
            EXPECT_STREQ(effect.GetPresetName(preset), row.name.c_str());
            std::size_t value = 0;
            for (std::uint32_t i = 0; i < expected.params.size(); ++i) {
                const ExpectedParam& param = expected.params[i];
                const std::uint32_t word =
                    param.kind == kKindGroup ? param.groupWord : StoredWord(param, row.shown.at(value++));
                PresetCell cell = {{.bits = 0xCCCCCCCCu}, 0xCCCCCCCCu};
                ASSERT_TRUE(effect.GetPresetValue(preset, i, &cell));
                EXPECT_EQ(cell.value.bits, word) << row.name << ", parameter " << i << " " << param.name;
                EXPECT_EQ(cell.second, 0u);
            }
            EXPECT_EQ(value, row.shown.size());
        }
    });
}

// A few cells by hand, so that the reading of effects.txt is not its own witness.
TEST(EffectTables, CellsCheckedByHand) {
    struct Cell {
        std::uint32_t effect, preset, parameter, word;
    };
    const Cell cells[] = {
        {0, 2, 2, 0x00C0C0C0u},        // "Film Camera", "Fire Light": the grey border
        {0, 7, 1, FloatBits(0.49f)},   // "Train Ride": X Jitter 4.9
        {1, 1, 1, FloatBits(0.745f)},  // "Film Look", "Bleached": Tint 49
        {1, 1, 5, FloatBits(0.85f)},   // Film Gamma 85
        {1, 29, 6, FloatBits(0.0f)},   // "Washed Out": Diffusion 0
        {2, 7, 1, 0},                  // "Film Damage", "Water Damage": Wavy
        {2, 7, 2, 1},                  // and the blue channel only
        {2, 0, 4, 0x3F0CCCCDu},        // a group's word
        {3, 5, 6, FloatBits(0.23f)},   // "Film Express", "Newsreel": Tint -54
        {4, 19, 2, FloatBits(0.025f)}  // "Film Pro", "Super 8": X Jitter 0.25
    };
    for (const Cell& expected : cells) {
        IVideoEffect* effect = CreateEffectByIndex(expected.effect);
        PresetCell cell = {};
        EXPECT_TRUE(effect->GetPresetValue(expected.preset, expected.parameter, &cell));
        EXPECT_EQ(cell.value.bits, expected.word) << expected.effect << ", " << expected.preset;
        effect->Release();
    }
}

}  // namespace
}  // namespace velmora::tests

#include "programs/common/settings.h"

#include <gtest/gtest.h>

#include <cstring>

#include "programs/common/digest.h"
#include "text/number_text.h"

namespace velmora::hosts {
namespace {

ParamInfo Slider(const char* name, float minimum, float maximum) {
    return {name, kKindSlider, minimum, maximum, {}, {}, false};
}

// Every kind, a shared name, and a group with the same name as a parameter.
EffectInfo TestEffect() {
    return {"Test",
            {{"Grain", kKindGroup, 0, 0, {}, {}, false},
             Slider("Shake", 0, 10),
             {"Tint", kKindColour, 0, 0, {}, {}, false},
             Slider("Tint", -100, 100),
             {"Grain", kKindMenu, 0, 0, {}, {"Fine", "Coarse"}, false},
             {"Thick", kKindCheckBox, 0, 0, {}, {}, false}},
            {"One", "Two"}};
}

TEST(Settings, StoreShownValues) {
    struct Row {
        const char* text;
        std::uint32_t parameter;
        float number;
    };
    for (const Row& row : {Row{"Shake=4", 1, 0.4f}, Row{"sh-ake'=10", 1, 1.0f}, Row{"Tint=-20", 3, 0.4f},
                           Row{"Tint=0", 3, 0.5f}}) {
        const Setting setting = ParseSetting(TestEffect(), row.text);
        EXPECT_EQ(setting.parameter, row.parameter) << row.text;
        EXPECT_EQ(setting.value.number, row.number) << row.text;
    }
}

TEST(Settings, StoreColoursItemsAndFlags) {
    struct Row {
        const char* text;
        std::uint32_t parameter, bits;
    };
    // Colour words have red in the lowest byte.
    for (const Row& row : {Row{"Tint=#336699", 2, 0x00996633u}, Row{"grain=COARSE", 4, 1},
                           Row{"Grain=0", 4, 0}, Row{"Thick=on", 5, 1}, Row{"Thick=NO", 5, 0}}) {
        const Setting setting = ParseSetting(TestEffect(), row.text);
        EXPECT_EQ(setting.parameter, row.parameter) << row.text;
        EXPECT_EQ(setting.value.bits, row.bits) << row.text;
    }
}

TEST(Settings, ShownValuesReadBack) {
    const EffectInfo effect = TestEffect();
    for (const char* text : {"Shake=2.5", "Tint=#0a0b0c", "Tint=12.5", "Grain=Coarse", "Thick=on"}) {
        const Setting setting = ParseSetting(effect, text);
        const ParamInfo& param = effect.params[setting.parameter];
        EXPECT_EQ(param.name + "=" + ShownValue(param, setting.value), text);
    }
}

TEST(Settings, RefusalsSayWhatWouldBeRight) {
    struct Row {
        const char* text;
        const char* words;
    };
    for (const Row& row : {Row{"Shake=11", "0 to 10"}, Row{"Tint=red", "#RRGGBB or a number"},
                           Row{"Grain=2", R"("Fine", "Coarse")"}, Row{"Thick=maybe", "on or off"},
                           Row{"Shape=1", R"("Shake", "Tint")"}, Row{"Shake", "NAME=VALUE"}}) {
        try {
            ParseSetting(TestEffect(), row.text);
            ADD_FAILURE() << row.text;
        } catch (const UsageError& error) {
            EXPECT_NE(std::strstr(error.what(), row.words), nullptr) << error.what();
        }
    }
}

TEST(Descriptors, FullFieldsNeedNoTerminator) {
    ParamDescriptor descriptor{};
    descriptor.kind = kKindMenu;
    descriptor.minimum.count = 2;
    std::memset(descriptor.name, 'n', sizeof descriptor.name);
    std::memset(descriptor.itemTexts[0], 'a', kMenuTextWidth);
    std::memcpy(descriptor.itemTexts[1], "b", 2);
    const ParamInfo info = ReadDescriptor(descriptor);
    EXPECT_EQ(info.name, std::string(kParamNameWidth, 'n'));
    EXPECT_EQ(info.items, (std::vector<std::string>{std::string(kMenuTextWidth, 'a'), "b"}));
}

TEST(Digest, LeavesPaddingOut) {
    // The MD5 of "abcdefghijklmnop", according to md5sum.
    const std::uint8_t rows[] = "abcdefgh....ijklmnop";
    EXPECT_EQ(FrameDigest(rows, 2, 2, 12), "1d64dce239c4437b7736041db089e1b9");
}

}  // namespace
}  // namespace velmora::hosts

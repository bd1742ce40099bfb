#include "programs/reelfx/common/timed_setting.h"

#include <gtest/gtest.h>

#include "text/number_text.h"

namespace velmora::hosts {
namespace {

const EffectInfo& Effect() {
    static const EffectInfo effect = [] {
        EffectInfo info{.name = "Test", .params = std::vector<ParamInfo>(4), .presets = {}};
        info.params[0].name = "Shake", info.params[0].kind = kKindSlider, info.params[0].maximum = 10.0f;
        info.params[1].name = "Tint", info.params[1].kind = kKindColour;
        info.params[2].name = "Grain", info.params[2].kind = kKindMenu,
        info.params[2].items = {"Fine", "Very Fine"};
        info.params[3].name = "Tint", info.params[3].kind = kKindSlider, info.params[3].maximum = 100.0f;
        return info;
    }();
    return effect;
}

TEST(TimedSetting, ChangesEvenlyBetweenItsPoints) {
    const struct {
        const char* text;
        ClipPlace place;
        const char* shown;
    } rows[] = {
        {"Shake=4", {.frame = 9, .seconds = 9.0}, "4"},
        {"Shake=2@10 6@20", {.frame = 0}, "2"},  // held before the first point
        {"Shake=2@10 6@20", {.frame = 10}, "2"},
        {"Shake=2@10 6@20", {.frame = 15}, "4"},
        {"Shake=2@10 6@20", {.frame = 20}, "6"},
        {"Shake=2@10 6@20", {.frame = 21, .seconds = 1.0}, "6"},  // and after the last
        {"Shake=2@0 6@0.5s  10@1s", {.frame = 3, .seconds = 0.25}, "4"},
        {"Shake=2@0 6@0.5s  10@1s", {.frame = 3, .seconds = 0.75}, "8"},
        {"Shake=1@5 9@5", {.frame = 4}, "1"},  // a jump
        {"Shake=1@5 9@5", {.frame = 5}, "9"},
        {"Tint=#000000@0 #ff8040@2", {.frame = 1}, "#804020"},
        {"Grain=Very Fine@0 Fine@9", {.frame = 8}, "Very Fine"},  // nothing lies between two items
        {"Grain=Very Fine@0 Fine@9", {.frame = 9}, "Fine"},
    };
    for (const auto& row : rows) {
        const TimedSetting setting(Effect(), row.text);
        EXPECT_EQ(ShownValue(Effect().params[setting.Parameter()], setting.At(row.place)), row.shown)
            << row.text;
    }
    const TimedSetting fade(Effect(), "shake=2.5@0   10@4s 3@4.5s");
    EXPECT_EQ(fade.Text(Effect().params[0]), "2.5@0 10@4s 3@4.5s");
    EXPECT_EQ(fade.Largest().number, 1.0f);
}

TEST(TimedSetting, RefusesWhatHasNoMeaning) {
    for (const char* text :
         {"Shake=1@5 2@4", "Shake=1@5 2@9s", "Shake=1@x", "Shake=1@", "Shake=@1", "Shake=1@-1", "Shake=1@2.5",
          "Shake=1@1 2", "Shake=11@0 1@5", "Tint=#000000@0 50@9", "@", "Shake=@"}) {
        EXPECT_THROW(TimedSetting(Effect(), text), UsageError) << text;
    }
}

}  // namespace
}  // namespace velmora::hosts

#include "effects/describe.h"

#include <gtest/gtest.h>

#include "tests/effects/expected_effects.h"

namespace velmora::tests {
namespace {

using namespace effects;

const ParamRow& Param(const EffectTable& effect, std::string_view name) {
    return effect.params[FindParam(effect, name).value()];
}

TEST(Describe, FindsNamesInAnyCase) {
    EXPECT_EQ(FindEffect("film PRO"), &kFilmPro);
    EXPECT_EQ(FindEffect("Film"), nullptr);
    EXPECT_EQ(FindEffect("Film Pro "), nullptr);
    EXPECT_EQ(FindPreset(kFilmCamera, "train ride"), 7u);
    EXPECT_EQ(FindPreset(kFilmCamera, "Sepia"), std::nullopt);
    EXPECT_EQ(FindParam(kFilmCamera, "x jitter"), 1u);
}

TEST(Describe, TellsTheTwoTintsApart) {
    EXPECT_EQ(FindParam(kFilmExpress, "Tint"), 6u);
    EXPECT_EQ(FindParam(kFilmExpress, "tint color"), 5u);
    EXPECT_EQ(FindParam(kFilmExpress, "Tint", kKindColour), 5u);
    EXPECT_EQ(FindParam(kFilmExpress, "Tint", kKindSlider), 6u);
    EXPECT_EQ(ParamKey(kFilmExpress, 5), "Tint Color");
    EXPECT_EQ(ParamKey(kFilmExpress, 6), "Tint");
    // A colour that shares its name with nothing keeps it.
    EXPECT_EQ(ParamKey(kFilmCamera, 2), "Border");
}

TEST(Describe, GroupsAreNoParametersToSet) {
    EXPECT_EQ(FindParam(kFilmDamage, "Scratches"), std::nullopt);
    EXPECT_EQ(FindParam(kFilmExpress, "Scratches"), 13u);
    EXPECT_EQ(ListParams(kFilmCamera),
              "\"Y Jitter\", \"X Jitter\", \"Border\", \"Flicker\", \"Flicker Rate\"");
}

TEST(Describe, ParsesShownValues) {
    const ParamRow& jitter = Param(kFilmCamera, "X Jitter");
    const ParamRow& tint = Param(kFilmLook, "Tint");
    const ParamRow& colour = Param(kFilmLook, "Tint Color");
    const ParamRow& pattern = Param(kFilmDamage, "Pattern");
    const ParamRow& box = Param(kFilmDamage, "Blue Channel Only");
    struct {
        const ParamRow& param;
        const char* text;
        std::uint32_t word;
    } const rows[] = {
        {jitter, "4", FloatBits(0.4f)},
        {jitter, "10", FloatBits(1.0f)},
        {jitter, "0.25", FloatBits(0.025f)},
        {jitter, "1e1", FloatBits(1.0f)},
        {tint, "-57", FloatBits(0.215f)},
        {tint, " +49 ", FloatBits(0.745f)},
        {tint, "-100", FloatBits(0.0f)},
        {colour, "#FF8000", 0x000080FFu},
        {colour, "01a2b3", 0x00B3A201u},
        {pattern, "Grainy", 2},
        {pattern, "crackly", 6},
        {box, "on", 1},
        {box, "No", 0},
        {box, "TRUE", 1},
        {box, "0", 0},
    };
    for (const auto& row : rows) {
        const ParsedValue parsed = ParseShown(row.param, row.text);
        ASSERT_TRUE(parsed.value.has_value()) << row.text << ": " << parsed.error;
        EXPECT_EQ(parsed.value->bits, row.word) << row.text;
    }
}

TEST(Describe, SaysWhatAValueMayBe) {
    struct {
        const char* effect;
        const char* param;
        const char* text;
        const char* error;
    } const rows[] = {
        {"Film Camera", "X Jitter", "11", "\"X Jitter\" takes a number from 0 to 10, not \"11\""},
        {"Film Camera", "X Jitter", "-0.1", "\"X Jitter\" takes a number from 0 to 10, not \"-0.1\""},
        {"Film Camera", "X Jitter", "4px", "\"X Jitter\" takes a number from 0 to 10, not \"4px\""},
        {"Film Camera", "X Jitter", "", "\"X Jitter\" takes a number from 0 to 10, not \"\""},
        {"Film Look", "Tint", "nan", "\"Tint\" takes a number from -100 to 100, not \"nan\""},
        {"Film Look", "Tint", "4,5", "\"Tint\" takes a number from -100 to 100, not \"4,5\""},
        {"Film Look", "Tint Color", "#FF80", "\"Tint\" takes a color #RRGGBB, not \"#FF80\""},
        {"Film Look", "Tint Color", "#-F8000", "\"Tint\" takes a color #RRGGBB, not \"#-F8000\""},
        {"Film Pro", "Black", "2", "\"Black\" takes on or off, not \"2\""},
        {"Film Pro", "Pattern", "Dusty",
         "\"Pattern\" takes one of Wavy, Blotchy, Grainy, Fine, Splotchy, Lite, Crackly, not \"Dusty\""},
    };
    for (const auto& row : rows) {
        const ParsedValue parsed = ParseShown(Param(*FindEffect(row.effect), row.param), row.text);
        EXPECT_FALSE(parsed.value.has_value()) << row.text;
        EXPECT_EQ(parsed.error, row.error);
    }
}

// Every value of every preset is shown as the colourist wrote it, and read back to the same word.
TEST(Describe, ShowsThePresetsAsTheyAreWritten) {
    for (std::size_t e = 0; e < kAllEffects.size(); ++e) {
        const EffectTable& effect = *kAllEffects[e];
        for (std::size_t p = 0; p < effect.presetNames.size(); ++p) {
            const ExpectedPreset& expected = ExpectedEffects()[e].presets[p];
            std::size_t value = 0;
            for (std::size_t i = 0; i < effect.params.size(); ++i) {
                const ParamRow& param = effect.params[i];
                const ValueWord stored = effect.presetCells[p * effect.params.size() + i].value;
                const std::string shown = FormatShown(param, stored);
                if (param.kind == kKindGroup) {
                    EXPECT_EQ(shown, "");
                    continue;
                }
                const std::string& written = expected.shown[value++];
                SCOPED_TRACE(expected.name + ", " + param.name + " " + written);
                const auto read = ParseShown(param, shown).value;
                ASSERT_TRUE(read.has_value());
                if (param.kind == kKindColour) {
                    // "0x00BBGGRR" as "#RRGGBB"; the top byte is no colour.
                    EXPECT_EQ(shown,
                              "#" + written.substr(8, 2) + written.substr(6, 2) + written.substr(4, 2));
                    EXPECT_EQ(read->colour, stored.colour & 0xFFFFFFu);
                } else {
                    EXPECT_EQ(shown, written);
                    EXPECT_EQ(read->bits, stored.bits);
                }
            }
        }
    }
}

TEST(Describe, ShowsNothingForAnItemThatDoesNotExist) {
    const ParamRow& pattern = Param(kFilmPro, "Pattern");
    EXPECT_EQ(FormatShown(pattern, {.item = 6}), "Crackly");
    EXPECT_EQ(FormatShown(pattern, {.item = 7}), "");
    EXPECT_EQ(FormatShown(pattern, {.item = -1}), "");
    EXPECT_EQ(FormatShown(Param(kFilmLook, "Tint"), {.number = 0.49999997f}), "0");
}

}  // namespace
}  // namespace velmora::tests

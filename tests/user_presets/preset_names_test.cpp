#include "user_presets/dialogs.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

namespace velmora {
namespace {

using namespace std::string_literals;

constexpr const char* kOwn = "Velmora Reel Effects";

TEST(PresetNames, ExtensionTellsLibraryAndEffect) {
    struct Case {
        const char* library;
        std::uint32_t effect;
        const char16_t* expected;
    };
    const Case cases[] = {
        {kOwn, 0, u"fxprela"}, {kOwn, 4, u"fxprele"}, {"velmora reel effects", 1, u"fxpunkb"},
        {"", 2, u"fxpunkc"},   {nullptr, 3, u"prs"},  {kOwn, 0xFFFFFFFFu, u"fxprel"},
    };
    for (const Case& c : cases) {
        EXPECT_EQ(std::u16string(MakePresetExtension(c.library, c.effect).data()), c.expected);
    }
}

std::u16string FilterText(const PresetFilter& filter, std::size_t length) {
    return {filter.data(), length};
}

TEST(PresetNames, FilterIsLabelAndPattern) {
    struct Case {
        const char* library;
        const char16_t* word;
        std::u16string expected;
    };
    const Case cases[] = {
        {kOwn, nullptr, u"Preset Files (*.fxprelb)\0*.fxprelb\0\0"s},
        {kOwn, u"Vorgaben", u"Vorgaben (*.fxprelb)\0*.fxprelb\0\0"s},
        {nullptr, nullptr, u"Preset Files (*.prs)\0*.prs\0\0"s},
    };
    for (const Case& c : cases) {
        EXPECT_EQ(FilterText(MakePresetFilter(c.library, 1, c.word), c.expected.size()), c.expected);
    }
}

// 100 characters: the word, " (*.fxprela)" 12, "*.fxprela" 9, three terminators: 76 are left for the word.
TEST(PresetNames, FilterIsCutInTheWordOnly) {
    const std::u16string tail = u" (*.fxprela)\0*.fxprela\0\0"s;
    const std::u16string fits(76, u'x');
    EXPECT_EQ(FilterText(MakePresetFilter(kOwn, 0, fits.c_str()), 100), fits + tail);
    EXPECT_EQ(FilterText(MakePresetFilter(kOwn, 0, (fits + u"y").c_str()), 100), fits + tail);
    const std::u16string half =
        std::u16string(75, u'x') + u"\xD83C\xDFAC";  // one character of two code units
    EXPECT_EQ(FilterText(MakePresetFilter(kOwn, 0, half.c_str()), 99), std::u16string(75, u'x') + tail);
}

}  // namespace
}  // namespace velmora

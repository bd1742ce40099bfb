#include "user_presets/preset_file.h"

#include <gtest/gtest.h>

#ifdef _WIN32
#include <windows.h>
#endif

#include <algorithm>
#include <bit>
#include <clocale>
#include <cmath>
#include <cstring>
#include <limits>
#include <string>
#include <string_view>

#include "tests/user_presets/fake_library.h"
#include "tests/user_presets/temporary_folder.h"

namespace velmora {
namespace {

using tests::TemporaryFolder;

template <std::size_t kSize>
void SetText(char (&field)[kSize], const std::string& text) {
    std::memset(field, 0, kSize);
    std::memcpy(field, text.data(), std::min(text.size(), kSize));
}

std::string PlatformLines(std::string text) {
#ifdef _WIN32
    for (std::size_t at = 0; (at = text.find('\n', at)) != std::string::npos; at += 2) text.insert(at, "\r");
#endif
    return text;
}

ValueCell NumberCell(float value) {
    return {ValueWord{.number = value}, 0, kKindSlider};
}

// A document around the elements of a "Preset".
std::string Document(const std::string& elements) {
    return "<?xml version=\"1.0\" standalone=\"no\" ?>\n<!-- Effect's Preset File -->\n"
           "<Preset Name=\"n\" LibraryName=\"l\" EffectName=\"e\">" +
           elements + "</Preset>\n";
}

bool Parse(const std::string& text, PresetRecord* record) {
    return ParsePreset(text.data(), text.size(), record);
}

PresetRecord Filled() {
    PresetRecord record;
    std::memset(&record, 0x5A, sizeof record);
    return record;
}

const char* const kCommaLocales[] = {"de_DE.UTF-8", "de_DE.utf8", "de_DE", "German_Germany.1252", "German"};

// Switches to a locale with a decimal comma for its lifetime.
class CommaLocale {
  public:
    CommaLocale() {
        for (const char* name : kCommaLocales) {
            if (std::setlocale(LC_ALL, name) != nullptr) break;
        }
    }
    ~CommaLocale() { std::setlocale(LC_ALL, "C"); }
    bool HasComma() const { return *std::localeconv()->decimal_point == ','; }
};

PresetRecord EveryKind() {
    PresetRecord record = {};
    SetText(record.name, "My look");
    SetText(record.libraryName, "Velmora Reel Effects");
    SetText(record.effectName, "Film Look");
    const ValueCell cells[] = {
        {ValueWord{.number = 0.5f}, std::bit_cast<std::uint32_t>(0.25f), kKindNone},
        {ValueWord{.item = -3}, 7, kKindMenu},
        {ValueWord{.number = 0.1f}, 7, kKindSlider},
        {ValueWord{.colour = 0xFF336699u}, 7, kKindColour},
        {ValueWord{.bits = 0x00000007u}, 7, kKindCheckBox},
        {ValueWord{.bits = 0xAAAAAA00u}, 7, kKindCheckBox},
        {ValueWord{.bits = 1}, 7, kKindGroup},
    };
    for (const ValueCell& cell : cells) record.values[record.count++] = cell;
    return record;
}

// 0xFF336699 as a signed number is -(0x100000000 - 0xFF336699) = -13408615.
constexpr const char* kEveryKindText =
    "<?xml version=\"1.0\" standalone=\"no\" ?>\n"
    "<!-- Effect's Preset File -->\n"
    "<Preset Name=\"My look\" LibraryName=\"Velmora Reel Effects\" EffectName=\"Film Look\">\n"
    "    <parameter type=\"0\" x=\"0.500000\" y=\"0.250000\" />\n"
    "    <parameter type=\"1\" value=\"-3\" />\n"
    "    <parameter type=\"2\" value=\"0.100000\" />\n"
    "    <parameter type=\"3\" value=\"-13408615\" />\n"
    "    <parameter type=\"4\" value=\"1\" />\n"
    "    <parameter type=\"4\" value=\"0\" />\n"
    "    <parameter type=\"5\" />\n"
    "</Preset>\n";

TEST(WritePreset, WritesExactlyThisText) {
    const TemporaryFolder folder;
    const PresetRecord record = EveryKind();
    ASSERT_TRUE(WritePreset(folder.File("a.fxprelb").c_str(), &record));
    EXPECT_EQ(folder.Read("a.fxprelb"), PlatformLines(kEveryKindText));
    EXPECT_EQ(folder.Count(), 1u) << "nothing is left beside the preset";
}

TEST(WritePreset, IgnoresTheHostsDecimalComma) {
    const TemporaryFolder folder;
    const PresetRecord record = EveryKind();
    const CommaLocale locale;
    if (!locale.HasComma()) GTEST_SKIP() << "no locale with a decimal comma on this machine";
    ASSERT_TRUE(WritePreset(folder.File("a").c_str(), &record));
    EXPECT_EQ(folder.Read("a"), PlatformLines(kEveryKindText));
    PresetRecord back = Filled();
    ASSERT_TRUE(ReadPreset(folder.File("a").c_str(), &back));
    EXPECT_EQ(back.values[2].value.number, 0.1f);
    EXPECT_TRUE(Parse(Document("<parameter type='2' value='0,75'/>"), &back));
    EXPECT_EQ(back.values[0].value.number, 0.0f) << "a comma ends the number";
}

TEST(WritePreset, WithoutValuesWritesAnEmptyElementThatIsNoPreset) {
    const TemporaryFolder folder;
    PresetRecord record = {};
    SetText(record.name, "a \"b\" & <c>\n");
    ASSERT_TRUE(WritePreset(folder.File("a").c_str(), &record));
    EXPECT_EQ(folder.Read("a"),
              PlatformLines("<?xml version=\"1.0\" standalone=\"no\" ?>\n<!-- Effect's Preset File -->\n"
                            "<Preset Name='a &quot;b&quot; &amp; &lt;c&gt;&#x0A;' LibraryName=\"\" "
                            "EffectName=\"\" />\n"));
    PresetRecord back = Filled();
    EXPECT_FALSE(ReadPreset(folder.File("a").c_str(), &back));
    EXPECT_EQ(back.count, 0);
    EXPECT_STREQ(back.name, "a \"b\" & <c>\n") << "the names are read all the same";
}

TEST(WritePreset, StaysInsideRecordsThatAreNotInOrder) {
    const TemporaryFolder folder;
    PresetRecord record = {};
    std::memset(record.name, 'n', sizeof record.name);
    for (const auto& [count, elements] :
         {std::pair{-1, 0}, {0, 0}, {100, 100}, {101, 100}, {0x7FFFFFFF, 100}}) {
        record.count = count;
        ASSERT_TRUE(WritePreset(folder.File("a").c_str(), &record));
        PresetRecord back = {};
        EXPECT_EQ(ReadPreset(folder.File("a").c_str(), &back), elements > 0);
        EXPECT_EQ(back.count, elements) << count;
        EXPECT_EQ(std::string(back.name), std::string(259, 'n'));
    }
    EXPECT_FALSE(WritePreset(folder.File("b").c_str(), nullptr));
    EXPECT_FALSE(WritePreset(nullptr, &record));
    EXPECT_EQ(folder.Count(), 1u);
}

TEST(Presets, KeepEveryByteOfANameThatCanBeInOne) {
    const TemporaryFolder folder;
    PresetRecord record = {};
    for (int byte = 1; byte < 256; ++byte) record.name[byte - 1] = static_cast<char>(byte);
    SetText(record.libraryName, "&#x41; &amp;amp; 'x' \"y\"");
    SetText(record.effectName, "\xEF\xBB\xBF\xE9t\xE9");
    record.values[record.count++] = NumberCell(1);
    ASSERT_TRUE(WritePreset(folder.File("a").c_str(), &record));
    PresetRecord back = Filled();
    ASSERT_TRUE(ReadPreset(folder.File("a").c_str(), &back));
    EXPECT_EQ(std::memcmp(record.name, back.name, sizeof record.name), 0);
    EXPECT_STREQ(back.libraryName, record.libraryName);
    EXPECT_STREQ(back.effectName, record.effectName);
}

TEST(Presets, KeepNumbersThatAreNotFinite) {
    const TemporaryFolder folder;
    using Limits = std::numeric_limits<float>;
    PresetRecord record = {};
    for (const float value :
         {Limits::quiet_NaN(), Limits::infinity(), -Limits::infinity(), Limits::max(), -0.0f}) {
        record.values[record.count++] = NumberCell(value);
    }
    ASSERT_TRUE(WritePreset(folder.File("a").c_str(), &record));
    PresetRecord back = {};
    ASSERT_TRUE(ReadPreset(folder.File("a").c_str(), &back));
    EXPECT_TRUE(std::isnan(back.values[0].value.number));
    for (int i = 1; i < record.count; ++i) EXPECT_EQ(back.values[i].value.bits, record.values[i].value.bits);
}

TEST(ReadPreset, CarriesValuesOverWhereOneIsMissing) {
    PresetRecord record = Filled();
    ASSERT_TRUE(Parse(Document("<parameter type='2'/>"               // nothing to carry yet
                               "<parameter x='0.5' y='0.25'/>"       // no type: 0
                               "<parameter type='0' x='1'/>"         // y carries over
                               "<parameter type='2' value='none'/>"  // the value too, and the second word
                               "<parameter type='1' value='-2'/>"
                               "<parameter type='4' value='9'/>"  // one byte only
                               "<parameter type='77' value='5'/>"
                               "<parameter type='-1'/>"
                               "<parameter type='three' x='2'/>"),
                      &record));
    const std::uint32_t quarter = std::bit_cast<std::uint32_t>(0.25f);
    const auto number = [](float value) { return std::bit_cast<std::uint32_t>(value); };
    const ValueCell expected[] = {
        {ValueWord{.bits = 0}, 0, 2},
        {ValueWord{.bits = number(0.5f)}, quarter, 0},
        {ValueWord{.bits = number(1)}, quarter, 0},
        {ValueWord{.bits = number(1)}, quarter, 2},
        {ValueWord{.bits = 0xFFFFFFFEu}, quarter, 1},
        {ValueWord{.bits = 0xFFFFFF01u}, quarter, 4},
        {ValueWord{.bits = 0xFFFFFF01u}, quarter, 77},
        {ValueWord{.bits = 0xFFFFFF01u}, quarter, 0xFFFFFFFFu},
        {ValueWord{.bits = number(2)}, quarter, 0},
    };
    ASSERT_EQ(record.count, 9);
    for (int i = 0; i < 9; ++i) {
        EXPECT_EQ(record.values[i].value.bits, expected[i].value.bits) << i;
        EXPECT_EQ(record.values[i].second, expected[i].second) << i;
        EXPECT_EQ(record.values[i].kind, expected[i].kind) << i;
    }
}

TEST(ReadPreset, DropsElementsBehindTheHundredth) {
    std::string elements;
    for (int i = 0; i < 150; ++i) elements += "<parameter type='1' value='" + std::to_string(i) + "'/>";
    PresetRecord record = Filled();
    ASSERT_TRUE(Parse(Document(elements), &record));
    EXPECT_EQ(record.count, 100);
    EXPECT_EQ(record.values[99].value.item, 99);
}

std::string Repeat(const char* text, int count) {
    std::string all;
    for (int i = 0; i < count; ++i) all += text;
    return all;
}

struct OddFile {
    const char* name;
    std::string text;
    int values;  // -1: failure, record untouched; 0: failure, names read; else success
};

TEST(ReadPreset, ReadsOddFiles) {
    const std::string one = "<parameter type='1' value='5'/>";
    const std::string full = Document(one);
    const OddFile files[] = {
        {"a note before the first parameter", Document("<note/>" + one + one), 2},
        {"other elements behind the first parameter", Document(one + "<note type='1' value='6'/>text<x/>"),
         3},
        {"comments, text and data between", Document("<!-- </Preset> -->a<![CDATA[<b>]]>" + one), 1},
        {"parameters with content", Document("<parameter type='1' value='5'><a><b/></a></parameter>"), 1},
        {"no parameter", Document("<note/>"), 0},
        {"parameter of another case", Document("<Parameter/>"), 0},
        {"Preset not at the top", "<a><Preset>" + one + "</Preset></a>", -1},
        {"second Preset is not read", "<Preset/><Preset>" + one + "</Preset>", 0},
        {"one line, LF, no declaration", "<Preset>" + one + "</Preset>", 1},
        {"CR only", "<Preset>\r" + one + "\r</Preset>\r", 1},
        {"CR LF", "<?xml version='1.0'?>\r\n<Preset>\r\n" + one + "\r\n</Preset>\r\n", 1},
        {"mark of UTF-8 in front", "\xEF\xBB\xBF" + full, 1},
        {"encoding declared", "<?xml version='1.0' encoding='UTF-8'?><Preset>" + one + "</Preset>", 1},
        {"UTF-16", std::string("\xFF\xFE<\0P\0r\0e\0s\0e\0t\0>\0", 18), -1},
        {"text behind the end", full + "garbage", 1},
        {"zero behind the end", full + std::string("\0<a>", 4), 1},
        {"zero inside", full.substr(0, 90) + std::string(1, '\0') + full.substr(90), -1},
        {"empty", "", -1},
        {"blanks", " \r\n\t", -1},
        {"binary",
         std::string("\x7F"
                     "ELF\x01\x02\x00\x03\xFF",
                     9),
         -1},
        {"unquoted and spaced attributes", "<Preset ><parameter type = 1 value=5 ></parameter ></Preset >",
         1},
        {"repeated attribute", Document("<parameter type='1' type='2'/>"), -1},
        {"wrong end tag", "<Preset>" + one + "</preset>", -1},
        {"missing end tag", "<Preset>" + one, -1},
        {"error behind the Preset", full + "<a", -1},
        {"reference without an end", Document("<parameter type='&#49'/>" + one), -1},
        {"reference that swallows markup", Document("<parameter a='&#x'/>" + Repeat("<a>", 99) + "x;'/>"),
         -1},
        {"such a reference in a declaration",
         "<?xml version='&#x' x;'?>" + Repeat("<a>", 99) + Repeat("</a>", 99) + full, -1},
        {"document type", "<!DOCTYPE a>" + full, 1},
        {"definitions of entities are not understood", "<!DOCTYPE a [<!ENTITY b 'c'>]>" + full, -1},
        {"own entities stay unknown", "<!DOCTYPE a><Preset Name='&b;'>" + one + "</Preset>", 1},
        {"64 levels", Document(one + Repeat("<a>", 63) + Repeat("</a>", 63)), 2},
        {"65 levels", Document(one + Repeat("<a>", 64) + Repeat("</a>", 64)), -1},
        {"65 levels, the last one empty", Document(one + Repeat("<a>", 63) + "<a/>" + Repeat("</a>", 63)),
         -1},
        {"a million levels", Repeat("<a>", 1'000'000), -1},
        {"levels hidden from a simple count", Repeat("<a b='/>'><!--</a>--><![CDATA[</a>]]>", 99), -1},
    };
    for (const OddFile& file : files) {
        PresetRecord record = Filled();
        const bool isRead = Parse(file.text, &record);
        EXPECT_EQ(isRead, file.values > 0) << file.name;
        if (file.values >= 0) {
            EXPECT_EQ(record.count, file.values) << file.name;
        } else {
            const PresetRecord untouched = Filled();
            const auto bytes = [](const PresetRecord& r) {
                return std::string_view(reinterpret_cast<const char*>(&r), sizeof r);
            };
            EXPECT_EQ(bytes(record), bytes(untouched)) << file.name;
        }
    }
}

TEST(ReadPreset, FailsAtEveryPlaceWhereAFileMayBeCut) {
    const std::string full = Document("<parameter type='1' value='5'/>");
    const std::size_t end = full.find("</Preset>") + std::strlen("</Preset>");
    for (std::size_t length = 0; length < end; ++length) {
        PresetRecord record = {};
        EXPECT_FALSE(Parse(full.substr(0, length), &record)) << length;
    }
}

TEST(ReadPreset, CutsLongNames) {
    PresetRecord record = Filled();
    ASSERT_TRUE(Parse("<Preset Name='" + std::string(300, 'a') + "' EffectName='" + std::string(259, 'b') +
                          "'><parameter/></Preset>",
                      &record));
    EXPECT_EQ(std::string(record.name), std::string(259, 'a'));
    EXPECT_EQ(std::string(record.effectName), std::string(259, 'b'));
    for (const char byte : record.libraryName) ASSERT_EQ(byte, 0);
}

// Sizes near the limit, in the shapes that cost the most per byte.
TEST(ReadPreset, EndsOnLargeFiles) {
    const std::string one = "<parameter type='2' value='0.5'/>";
    const TemporaryFolder folder;
    PresetRecord record = {};
    std::string large = Document(one + std::string((10u << 20), ' '));
    EXPECT_TRUE(ReadPreset(folder.Write("blanks", large).c_str(), &record));
    large.resize(kPresetFileLimit, ' ');
    EXPECT_TRUE(ReadPreset(folder.Write("limit", large).c_str(), &record));
    EXPECT_FALSE(ReadPreset(folder.Write("over", large + " ").c_str(), &record));
    EXPECT_TRUE(Parse(Document(Repeat(one.c_str(), 100'000)), &record));
    EXPECT_EQ(record.count, 100);
    EXPECT_FALSE(Parse(Document(Repeat("<a/>", 4'000'000)), &record));
    std::string attributes = "<parameter ";
    for (int i = 0; i < 1'000'000; ++i) attributes += "a" + std::to_string(i) + "='' ";
    EXPECT_FALSE(Parse(Document(attributes + "/>"), &record));
    EXPECT_FALSE(Parse(Document(one + Repeat("&#", 4'000'000)), &record));
}

TEST(ReadPreset, FailsOnWhatIsNoFile) {
    const TemporaryFolder folder;
    PresetRecord record = {};
    EXPECT_FALSE(ReadPreset(folder.File("missing").c_str(), &record));
    EXPECT_FALSE(ReadPreset(folder.Path().string().c_str(), &record));
    EXPECT_FALSE(ReadPreset("", &record));
    EXPECT_FALSE(ReadPreset(nullptr, &record));
    EXPECT_FALSE(ReadPreset(folder.Write("a", Document("<parameter/>")).c_str(), nullptr));
}

#ifdef _WIN32
// This pipe blocks its reader, as "COM1" does in every folder.
TEST(ReadPreset, DoesNotWaitForADevice) {
    const std::string name = "\\\\.\\pipe\\velmora-" + std::to_string(GetCurrentProcessId());
    const HANDLE pipe = CreateNamedPipeA(name.c_str(), PIPE_ACCESS_OUTBOUND, 0, 1, 0, 0, 0, nullptr);
    ASSERT_NE(pipe, INVALID_HANDLE_VALUE);
    PresetRecord record = {};
    EXPECT_FALSE(ReadPreset(name.c_str(), &record));
    CloseHandle(pipe);
}
#endif

}  // namespace
}  // namespace velmora

// Strings, the code page and translated texts.
#include <gtest/gtest.h>

#include <string>
#include <type_traits>

#include "text/encodings.h"
#include "text/strings.h"
#include "language/translation.h"
#include "tests/user_presets/fake_library.h"
#ifdef _WIN32
#include <windows.h>
#endif

namespace velmora {
namespace {

using tests::FakeLibrary;
using tests::FakeTexts;

// Tests of single characters are valid for the Western European code page only.
bool IsWestern() {
#ifdef _WIN32
    return GetACP() == 1252;
#else
    return true;
#endif
}

template <typename String, typename Character>
void ExpectText(const String& string, const Character* expected) {
    const std::basic_string<Character> text = expected;
    EXPECT_EQ(string.Length(), text.size());
    EXPECT_EQ(string.IsNotEmpty(), !text.empty());
    ASSERT_EQ(string.Text() == nullptr, text.empty());
    if (!text.empty()) {
        EXPECT_EQ(string.Text(), text);
    }
}

TEST(Strings, TakeTextsAsTheyArePassed) {
    struct Case {
        const char* text;
        std::uint32_t length;
        const char* expected;
    };
    const Case cases[] = {
        {nullptr, 0, ""}, {nullptr, 5, ""}, {nullptr, kMeasureText, ""},  {"", kMeasureText, ""},
        {"abc", 0, ""},   {"abc", 2, "ab"}, {"abc", kMeasureText, "abc"},
    };
    for (const Case& c : cases) {
        ExpectText(VMString(c.text, c.length), c.expected);
        const std::u16string wide = c.text != nullptr ? std::u16string(c.text, c.text + strlen(c.text)) : u"";
        const std::string expected = c.expected;
        ExpectText(VMUnicodeString(c.text != nullptr ? wide.c_str() : nullptr, c.length),
                   std::u16string(expected.begin(), expected.end()).c_str());
        VMString assigned("before", kMeasureText);
        assigned.Assign(c.text, c.length);
        ExpectText(assigned, c.expected);
    }
}

TEST(Strings, OwnTheirCharacters) {
    VMString first("abc", kMeasureText);
    VMString copy(first);
    first.Clear();
    ExpectText(first, "");
    ExpectText(copy, "abc");
    copy.Assign(copy.Text() + 1, 1);  // part of its own text
    ExpectText(copy, "b");
    first = copy;
    ExpectText(first, "b");

    VMUnicodeString wide(u"abc", kMeasureText);
    wide.Assign(wide);
    ExpectText(wide, u"abc");
    wide.Append(wide);
    wide.Append(VMUnicodeString());
    ExpectText(wide, u"abcabc");
    EXPECT_TRUE(wide.IsIndex(5));
    EXPECT_FALSE(wide.IsIndex(6));
    VMUnicodeString empty;
    EXPECT_FALSE(empty.IsIndex(0));
    empty.Append(VMUnicodeString(u"x", 1));
    ExpectText(empty, u"x");
}

TEST(Strings, CompareAllCharacters) {
    const VMUnicodeString none, alsoNone(u"abc", 0), a(u"a", 1), ab(u"ab", 2), ac(u"ac", 2), other(u"ab", 2);
    EXPECT_TRUE(none == alsoNone);
    EXPECT_TRUE(ab == other);
    EXPECT_FALSE(a == ab);
    EXPECT_FALSE(ab == ac);
    EXPECT_FALSE(none == a);
}

TEST(Strings, HaveTheirLengthBehindTheTable) {
    struct Shape {
        void* table;
        std::uint32_t length;
        void* data;
    };
    static_assert(sizeof(VMString) == sizeof(Shape) && sizeof(VMUnicodeString) == sizeof(Shape));
    static_assert(std::has_virtual_destructor_v<VMString> && std::has_virtual_destructor_v<VMUnicodeString>);
}

TEST(Strings, WidenFromTheCodePage) {
    ExpectText(VMString().ToUnicode(), u"");
    ExpectText(VMString("Film Look", kMeasureText).ToUnicode(), u"Film Look");
    if (!IsWestern()) GTEST_SKIP() << "another code page";
    ExpectText(VMString("\x80\xE9\xFF\x9F", kMeasureText).ToUnicode(), u"\u20AC\u00E9\u00FF\u0178");
}

TEST(CodePage, NarrowsExactNamesOnly) {
    if (!IsWestern()) GTEST_SKIP() << "another code page";
    struct Case {
        const char16_t* name;
        const char* expected;  // null: cannot be converted exactly
    };
    const Case cases[] = {
        {u"a.fxprela", "a.fxprela"},
        {u"\u00E9t\u00E9\u20AC", "\xE9t\xE9\x80"},
        {u"", nullptr},
        {u"\u4E2D", nullptr},
        {u"\u0100", nullptr},  // A with macron: best-fit conversion gives "A"
        {u"\u2215", nullptr},  // division slash: best-fit conversion gives a path separator
        {u"\uFF21", nullptr},  // full-width A
        {u"e\u0301", nullptr},
        {u"\xD83C\xDFAC", nullptr},
        {u"\xD83C", nullptr},
    };
    for (const Case& c : cases) {
        char buffer[32] = "untouched";
        EXPECT_EQ(NarrowFileName(c.name, buffer, sizeof buffer), c.expected != nullptr);
        if (c.expected != nullptr) {
            EXPECT_STREQ(buffer, c.expected);
        }
    }
    char small[4];
    EXPECT_TRUE(NarrowFileName(u"abc", small, sizeof small));
    EXPECT_FALSE(NarrowFileName(u"abcd", small, sizeof small));
    EXPECT_FALSE(NarrowFileName(nullptr, small, sizeof small));
}

class TranslationTest : public testing::Test {
  protected:
    TranslationTest() {
        m_texts.texts = {{{4, "Open Preset"}, u"Vorgabe \u00F6ffnen"},
                         {{8, "long"}, std::u16string(3000, u'x')}};
        m_library.texts = &m_texts;
    }
    std::u16string Translate(std::int32_t category, const char* key, const char* fallback = nullptr) {
        return m_helper.Translate(category, key, fallback, &m_wasFound);
    }

    FakeTexts m_texts;
    FakeLibrary m_library;
    TranslationHelper m_helper;
    bool m_wasFound = false;
};

TEST_F(TranslationTest, FindsOrFallsBack) {
    EXPECT_EQ(Translate(4, "Open Preset"), u"Open Preset") << "nobody to ask yet";
    m_helper.SetContext(&m_library, "de");
    EXPECT_EQ(Translate(4, "Open Preset", "other"), u"Vorgabe \u00F6ffnen");
    EXPECT_TRUE(m_wasFound);
    EXPECT_EQ(Translate(5, "Open Preset"), u"Open Preset");
    EXPECT_FALSE(m_wasFound);
    EXPECT_EQ(Translate(5, "Version", "Version 1.0"), u"Version 1.0");
    EXPECT_EQ(Translate(5, nullptr), u"");
    EXPECT_EQ(m_helper.Translate(4, "Open Preset"), std::u16string(u"Vorgabe \u00F6ffnen"));
    EXPECT_EQ(m_texts.references, 0) << "given back after every lookup";
    m_library.texts = nullptr;
    EXPECT_EQ(Translate(4, "Open Preset"), u"Open Preset");
}

TEST_F(TranslationTest, CutsLongTexts) {
    m_helper.SetContext(&m_library, "de");
    EXPECT_EQ(Translate(8, "long"), std::u16string(2047, u'x'));
    EXPECT_EQ(m_texts.lastCapacity, 2048);
    EXPECT_EQ(Translate(8, std::string(3000, 'y').c_str()), std::u16string(2047, u'y'));
}

TEST_F(TranslationTest, TakesTwoLetterCodesOnly) {
    const std::pair<const char*, const char*> cases[] = {{"de", "de"}, {nullptr, "en"}, {"", "en"},
                                                         {"d", "en"},  {"deu", "en"},   {"JA", "JA"}};
    for (const auto& [code, expected] : cases) {
        m_helper.SetContext(&m_library, code);
        Translate(4, "Open Preset");
        EXPECT_EQ(m_texts.lastLanguage, expected);
    }
}

}  // namespace
}  // namespace velmora

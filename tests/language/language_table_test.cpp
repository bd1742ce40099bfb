#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include <gtest/gtest.h>

#include "language/language_table.h"

namespace velmora::language {
namespace {

const std::string kStart = "<texts version='1'><language code='de' name='D'><category id='8'>";
const std::string kEnd = "</category></language></texts>";

std::string FileWith(const std::string& texts) {
    return kStart + texts + kEnd;
}

std::u16string TextOf(const std::string& file, const char* language, std::int32_t category, const char* key) {
    const std::optional<LanguageTable> table = LanguageTable::Read(file);
    if (!table) return u"(refused)";
    const char16_t* const text = table->Find(language, category, key);
    return text ? text : u"(none)";
}

TEST(LanguageTable, ReadsTexts) {
    struct Row {
        const char* name;
        std::string inside;
        std::u16string text;
    };
    const Row rows[] = {
        {"ASCII", "<text key='k'>Help</text>", u"Help"},
        {"letters of 2, 3 and 4 bytes", "<text key='k'>ö語\xF0\x9F\x8E\xA5</text>", u"ö語\U0001F3A5"},
        {"named references", "<text key='k'>&amp;A &lt;&gt;&quot;&apos;</text>", u"&A <>\"'"},
        {"numbered references", "<text key='k'>&#246;&#x8A9E;</text>", u"ö語"},
        {"white space condensed", "<text key='k'>\n  a \t b\r\n</text>", u"a b"},
        {"comments around", "<!-- <a> & --><text key='k'>a</text><!---->", u"a"},
        {"a tag over lines", "<text\n key = \"k\"\n>a</text >", u"a"},
    };
    for (const Row& row : rows) {
        EXPECT_EQ(TextOf(FileWith(row.inside), "de", 8, "k"), row.text) << row.name;
    }
    const std::string inside = "<text key='k'>a</text>";
    const std::string declaration = "<?xml version='1.0' encoding='utf-8'?>\r\n";
    EXPECT_EQ(TextOf("\xEF\xBB\xBF" + declaration + FileWith(inside) + "\n", "de", 8, "k"), u"a");
}

TEST(LanguageTable, FindsOnlyWhatIsThere) {
    struct Row {
        const char* language;
        std::int32_t category;
        const char* key;
        std::u16string text;
    };
    const std::string file = FileWith("<text key='OK'>gut</text><text key='Ja &amp; Nein'>vielleicht</text>");
    const Row rows[] = {
        {"de", 8, "OK", u"gut"},       {"DE", 8, "OK", u"gut"},    {"dE", 8, "Ja & Nein", u"vielleicht"},
        {"de", 8, "ok", u"(none)"},    {"de", 5, "OK", u"(none)"}, {"en", 8, "OK", u"(none)"},
        {"de", -8, "OK", u"(none)"},   {"d", 8, "OK", u"(none)"},  {"", 8, "OK", u"(none)"},
        {"deu", 8, "OK", u"(none)"},   {"de", 8, "", u"(none)"},   {nullptr, 8, "OK", u"(none)"},
        {"de", 8, nullptr, u"(none)"},
    };
    for (const Row& row : rows) {
        EXPECT_EQ(TextOf(file, row.language, row.category, row.key), row.text)
            << (row.language ? row.language : "null") << row.category << (row.key ? row.key : "null");
    }
}

std::string Repeated(std::string_view text, std::size_t count) {
    std::string result;
    for (std::size_t i = 0; i < count; ++i) result += text;
    return result;
}

TEST(LanguageTable, RefusesBrokenFiles) {
    const std::string good = "<text key='k'>a</text>";
    const struct {
        const char* name;
        std::string file;
    } rows[] = {
        {"empty", ""},
        {"no markup", "Hello"},
        {"declaration only", "<?xml version='1.0'?>"},
        {"cut in the end tag", FileWith(good).substr(0, FileWith(good).size() - 1)},
        {"cut in a text", kStart + "<text key='k'>a"},
        {"open comment", FileWith(good) + "<!-- "},
        {"text behind the root", FileWith(good) + "x"},
        {"two roots", FileWith(good) + FileWith("<text key='m'>a</text>")},
        {"wrong end tag", FileWith("<text key='k'>a</tex>")},
        {"open quote", FileWith("<text key='k>a</text>")},
        {"value without quotes' end", FileWith("<text key=\"/><text key=\">a</text>")},
        {"wrong root", "<language version='1'></language>"},
        {"wrong version", "<texts version='2'></texts>"},
        {"no version", "<texts></texts>"},
        {"unknown element", FileWith("<word key='k'>a</word>")},
        {"unknown attribute", FileWith("<text key='k' use='b'>a</text>")},
        {"attribute twice", FileWith("<text key='k' key='k'>a</text>")},
        {"no key", FileWith("<text>a</text>")},
        {"empty key", FileWith("<text key=''>a</text>")},
        {"long key", FileWith("<text key='" + std::string(256, 'k') + "'>a</text>")},
        {"empty text", FileWith("<text key='k'></text>")},
        {"blank text", FileWith("<text key='k'> \n</text>")},
        {"element within a text", FileWith("<text key='k'>a<b/></text>")},
        {"loose text", FileWith("a")},
        {"key twice", FileWith(good + good)},
        {"long language code", "<texts version='1'><language code='deu' name='D'></language></texts>"},
        {"capital language code", "<texts version='1'><language code='DE' name='D'></language></texts>"},
        {"category not a number",
         "<texts version='1'><language code='de' name='D'><category id='8x'/></language></texts>"},
        {"category too large",
         "<texts version='1'><language code='de' name='D'><category id='4294967304'/></language></texts>"},
        {"zero byte", FileWith(good) + std::string(1, '\0')},
        {"control byte", FileWith("<text key='k'>\x01</text>")},
        {"stray continuation byte", FileWith("<text key='k'>\x80</text>")},
        {"overlong form", FileWith("<text key='k'>\xC0\xAF</text>")},
        {"surrogate in UTF-8", FileWith("<text key='k'>\xED\xA0\x80</text>")},
        {"sequence cut short", FileWith("<text key='k'>\xE8\xAA</text>")},
        {"sequence past the file's end", "<a\xE8></a\xE8>"},
        {"past the last character", FileWith("<text key='k'>\xF4\x90\x80\x80</text>")},
        {"bad UTF-8 in a key", FileWith("<text key='\xFF'>a</text>")},
        {"UTF-16", std::string("\xFF\xFE<\0t\0", 6)},
        {"loose ampersand", FileWith("<text key='k'>a & b</text>")},
        {"unknown reference", FileWith("<text key='k'>&nbsp;</text>")},
        {"reference to zero", FileWith("<text key='k'>&#0;</text>")},
        {"reference to a surrogate", FileWith("<text key='k'>&#xD800;</text>")},
        {"reference that overflows", FileWith("<text key='k'>&#4294967361;</text>")},
        {"entity of its own", "<!DOCTYPE texts [<!ENTITY a 'b'>]>" + FileWith("<text key='k'>&a;</text>")},
        {"CDATA", FileWith("<text key='k'><![CDATA[a]]></text>")},
        {"instruction", FileWith("<?run me?>" + good)},
        {"deep", Repeated("<a>", 200000)},
        {"deep and closed", Repeated("<a>", 9) + Repeated("</a>", 9)},
        {"deep behind a quote", Repeated("<a b='/>'>", 200000)},
        {"too large", FileWith(good) + std::string(kLargestFile, ' ')},
    };
    for (const auto& row : rows) EXPECT_FALSE(LanguageTable::Read(row.file)) << row.name;
    EXPECT_TRUE(LanguageTable::Read(FileWith(good))) << "what the rows above vary";
}

}  // namespace
}  // namespace velmora::language

#include <cstdint>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "text/encodings.h"

namespace velmora::language {
namespace {

TEST(CopyText, CutsTerminatesAndStaysInside) {
    struct Row {
        const char* name;
        const char16_t* text;
        std::int32_t capacity;
        std::u16string written;
    };
    const Row rows[] = {
        {"shorter than the buffer", u"abc", 10, u"abc"},
        {"exact", u"abc", 4, u"abc"},
        {"cut by one", u"abc", 3, u"ab"},
        {"terminator only", u"abc", 1, u""},
        {"null text", nullptr, 4, u""},
        {"empty text", u"", 4, u""},
        {"pair fits", u"a\U0001F3A5", 4, u"a\U0001F3A5"},
        {"pair would be split", u"a\U0001F3A5", 3, u"a"},
        {"nothing but half a pair", u"\U0001F3A5", 2, u""},
        {"cut behind a pair", u"\U0001F3A5z", 3, u"\U0001F3A5"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        constexpr char16_t kUntouched = 0xCCCC;
        std::vector<char16_t> buffer(16, kUntouched);
        const std::int32_t length = CopyText(row.text, buffer.data(), row.capacity);
        EXPECT_EQ(length, static_cast<std::int32_t>(row.written.size()));
        EXPECT_EQ(std::u16string(buffer.data()), row.written);
        for (std::size_t i = static_cast<std::size_t>(row.capacity); i < buffer.size(); ++i) {
            EXPECT_EQ(buffer[i], kUntouched) << i;
        }
    }
}

TEST(CopyText, TouchesNothingWithoutABuffer) {
    char16_t character = u'x';
    EXPECT_EQ(CopyText(u"abc", nullptr, 10), 0);
    EXPECT_EQ(CopyText(u"abc", &character, 0), 0);
    EXPECT_EQ(CopyText(u"abc", &character, INT32_MIN), 0);
    EXPECT_EQ(character, u'x');
}

}  // namespace
}  // namespace velmora::language

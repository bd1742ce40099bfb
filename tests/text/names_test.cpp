#include "text/names.h"

#include <gtest/gtest.h>

#include <vector>

namespace velmora {
namespace {

TEST(Names, AreMatchedByLettersAndDigits) {
    EXPECT_TRUE(IsSameName("60s-memories", "60's Memories"));
    EXPECT_TRUE(IsSameName("Fluorescent Light", "Flourescent Light"));
    EXPECT_TRUE(IsSameName("FLOURESCENT_LIGHT", "fluorescent light"));
    EXPECT_FALSE(IsSameName("Sepia", "Sepi"));
}

TEST(Names, TheNearestIsTheOneThatWasMeant) {
    const std::vector<std::string> names = {"Sepia", "Film Look", "Film Lock", "Saturated Colors",
                                            "Tint",  "Tint",      "Cool"};
    const struct {
        const char* typed;
        std::optional<std::string> nearest;
    } rows[] = {
        {"Sepa", "Sepia"},    // a letter too few
        {"seppia", "Sepia"},  // one too many
        {"Sepai", "Sepia"},   // two exchanged
        {"Satuarted Colours", "Saturated Colors"},
        {"Satur", "Saturated Colors"},  // only the beginning
        {"Tnt", "Tint"},
        {"Film Loik", std::nullopt},  // as near to two of them
        {"Wobble", std::nullopt},
        {"Co", std::nullopt},
        {"", std::nullopt},
    };
    for (const auto& row : rows) EXPECT_EQ(NearestName(row.typed, names), row.nearest) << row.typed;
}

}  // namespace
}  // namespace velmora

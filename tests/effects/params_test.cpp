// The parameter objects, the master settings list and the use of its values.

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <string>

#include "effects/master_settings.h"
#include "tests/common/fake_host.h"

namespace velmora {
namespace {

using testing::FakeHost;

constexpr float kNan = std::numeric_limits<float>::quiet_NaN();

ParamDescriptor DirtyDescriptor() {
    ParamDescriptor descriptor;
    std::memset(&descriptor, 0xCC, sizeof descriptor);
    return descriptor;
}

TEST(CopyBounded, StopsBehindTheZeroOrAtTheFieldsEnd) {
    char field[6] = {'x', 'x', 'x', 'x', 'x', 'x'};
    CopyBounded(field, 6, "ab");
    EXPECT_EQ(std::string(field, 6), std::string("ab\0xxx", 6));
    CopyBounded(field, 5, "abcdefg");
    EXPECT_EQ(std::string(field, 6), "abcdex");
}

TEST(Params, SlidersReadTheMaximumTimesTheHostsValue) {
    struct Row {
        float host;
        std::int32_t integer;  // 0..10
        float percent;         // -100..100
    };
    const Row rows[] = {
        {0.25f, 3, 25}, {0.24f, 2, 24},  {0.5f, 5, 50}, {1.0f, 10, 100},
        {-3.0f, 0, 0},  {7.0f, 10, 100}, {kNan, 0, 0},  {std::numeric_limits<float>::infinity(), 10, 100}};
    for (const Row& row : rows) {
        FakeHost host;
        host.SetNumber(4, row.host);
        CRsFX_IntegerSlider integer(101, "I", 0, 10, 2);
        CRsFX_PercentSlider percent(304, "P", -100, 100, 0, 1);
        integer.ReadFromHost(host, 4);
        percent.ReadFromHost(host, 4);
        EXPECT_EQ(integer.Value(), row.integer) << row.host;
        EXPECT_EQ(percent.Value(), 100.0f * SanitizeNormalised(row.host)) << row.host;
        EXPECT_NEAR(percent.Value(), row.percent, 1e-5) << row.host;
        EXPECT_EQ(host.requests[0], (FakeHost::Request{4, kKindSlider}));
    }
}

TEST(Params, MenusKeepTheirValueForIndicesOutside) {
    const MenuItem items[] = {{"A", 2000}, {"B", 2001}, {"C", 2001}, {nullptr, 0}};
    CRsFX_Menu menu(602, "M", items, 2001);
    FakeHost host;
    host.SetBits(0, 2);
    menu.ReadFromHost(host, 0);
    EXPECT_EQ(menu.Value(), 0) << "no items are counted before the first description";
    ParamDescriptor descriptor = DirtyDescriptor();
    menu.Describe(descriptor);
    EXPECT_EQ(descriptor.defaultValue.item, 2) << "a later match replaces an earlier one";
    EXPECT_EQ(descriptor.minimum.count, 3u);
    EXPECT_STREQ(descriptor.itemTexts[1], "B");
    for (const auto& [index, value] : {std::pair{0u, 2000}, {3u, 2000}, {1u, 2001}, {0xFFFFFFFFu, 2001}}) {
        host.SetBits(0, index);
        menu.ReadFromHost(host, 0);
        EXPECT_EQ(menu.Value(), value) << index;
    }
}

TEST(Params, ColoursAndChecksTakeTheirPartOfTheWord) {
    FakeHost host;
    host.SetBits(0, 0xAB336699);
    CRsFX_ColorPicker picker(103, "C", 0xFF000000);
    picker.ReadFromHost(host, 0);
    EXPECT_EQ(picker.Value(), 0xFF996633u);
    CRsFX_CheckBox box(704, "B", true);
    host.SetBits(0, 0xFFFFFF00);
    box.ReadFromHost(host, 0);
    EXPECT_FALSE(box.Value());
    host.SetBits(0, 7);
    box.ReadFromHost(host, 0);
    EXPECT_TRUE(box.Value());
    box.ReadFromHost(host, 9);
    EXPECT_FALSE(box.Value()) << "a value that the host does not give reads as 0";
}

TEST(Params, DescriptionsZeroTheRecordAndExpose) {
    CRsFX_PercentSlider slider(302, "A name of more than forty characters, all told", -100, 50, 25, 1);
    EXPECT_FALSE(slider.IsExposed());
    ParamDescriptor descriptor = DirtyDescriptor();
    slider.Describe(descriptor);
    EXPECT_TRUE(slider.IsExposed());
    EXPECT_EQ(descriptor.kind, kKindSlider);
    EXPECT_EQ(descriptor.defaultValue.number, 0.5f) << "by the maximum, not by the range";
    EXPECT_EQ(descriptor.minimum.number, -100.0f);
    EXPECT_EQ(descriptor.slider.maximum.number, 50.0f);
    EXPECT_EQ(std::string(descriptor.name, 40), "A name of more than forty characters, al");
    EXPECT_EQ(descriptor.second, 0u);
    EXPECT_EQ(descriptor.visible, 0u);

    CRsFX_Group group(100, "G", true);
    group.Describe(descriptor = DirtyDescriptor());
    EXPECT_FALSE(group.IsExposed());
    EXPECT_EQ(descriptor.kind, kKindNone);
    EXPECT_STREQ(descriptor.name, "G");
}

TEST(MasterSettings, AreAskedForInTheirOrder) {
    const char* names[] = {
        "Y Jitter",          "X Jitter", "Border",    "Flicker",    "Flicker Speed", "Brightness", "Contrast",
        "Saturation",        "Tint",     "Tint",      "Film Gamma", "Glow",          "Wear",       "Pattern",
        "Blue Channel Only", "Spots",    "Scratches", "Depth",      "Black",         "White",      "Thick"};
    const std::uint32_t kinds[] = {2, 2, 3, 2, 2, 2, 2, 2, 3, 2, 2, 2, 2, 1, 4, 2, 2, 2, 4, 4, 4};
    MasterSettingsList list;
    ASSERT_TRUE(list.Fill());
    FakeHost host;
    list.ReadFromHost(host);
    EXPECT_TRUE(host.requests.empty()) << "nothing is read before it has been described";
    ParamDescriptor descriptor;
    for (std::uint32_t i = 0; i < 21; ++i) {
        ASSERT_TRUE(list.DescribeExposed(i, descriptor));
        EXPECT_STREQ(descriptor.name, names[i]);
        EXPECT_EQ(descriptor.kind, kinds[i]);
    }
    EXPECT_FALSE(list.DescribeExposed(21, descriptor));
    list.ReadFromHost(host);
    ASSERT_EQ(host.requests.size(), 21u);
    for (std::uint32_t i = 0; i < 21; ++i) EXPECT_EQ(host.requests[i], (FakeHost::Request{i, kinds[i]}));
}

TEST(MasterSettings, GettersLeaveTheDestinationWhenTheKindIsWrong) {
    MasterSettingsList list;
    ASSERT_TRUE(list.Fill());
    EXPECT_EQ(list.Find(304, kClassIntegerSlider), nullptr);
    EXPECT_EQ(list.Find(304, kClassParam), nullptr);
    EXPECT_EQ(list.Find(999, kClassGroup), nullptr);
    EXPECT_NE(list.Find(100, kClassGroup), nullptr);
    std::int32_t kept = -7;
    list.GetInteger(Master::kBrightness, kept);
    EXPECT_EQ(kept, -7);
    list.GetInteger(Master::kYJitter, kept);
    EXPECT_EQ(kept, 2);
    float number = 0;
    list.GetPercentNormalised(Master::kBrightness, number);
    EXPECT_EQ(number, 0.5f);
    list.GetPercentSigned(Master::kBrightness, number);
    EXPECT_EQ(number, 0.0f);
}

// Settings read from a host's values, one master index at a time.
render::StageSettings Settings(FakeHost& host) {
    MasterSettingsList list;
    EXPECT_TRUE(list.Fill());
    list.ExposeAll();
    list.ReadFromHost(host);
    return ReadStageSettings(list);
}

// The other units are covered by the predicted frames; these are the midpoints between two steps, and the settings
// that are not predicted.
TEST(StageSettings, SlidersBecomeTheStagesUnits) {
    FakeHost host;
    host.SetNumber(1, 0.25f);  // 2.5 -> 3
    host.SetNumber(4, 0.25f);  // 7.5 changes a second -> 8
    host.SetNumber(11, 0.75f);
    const render::StageSettings s = Settings(host);
    EXPECT_EQ(s.yJitter, 0);
    EXPECT_EQ(s.xJitter, 3);
    EXPECT_EQ(s.flickerRate, 8u);
    EXPECT_EQ(s.glow, 0.75f);
}

TEST(StageSettings, ScratchesNeedAKindAnAmountAndADepth) {
    struct Row {
        const char* name;
        float amount, depth;  // the host's values
        bool black, white, thick;
        std::uint32_t count;
        float seed;
    };
    const Row rows[] = {{"no kind", 1, 1, false, false, false, 0, 0},
                        {"lightest", 0.03f, 0.5f, true, false, false, 1, 38.5f},
                        {"most", 1, 1, true, true, true, 16, 136},
                        {"half", 0.5f, 0.25f, false, true, false, 8, 85.25f},
                        {"no amount", 0, 1, true, false, false, 0, 0},
                        {"no depth", 1, 0, true, false, false, 0, 0}};
    for (const Row& row : rows) {
        FakeHost host;
        host.SetNumber(16, row.amount);
        host.SetNumber(17, row.depth);
        host.SetBits(18, row.black), host.SetBits(19, row.white), host.SetBits(20, row.thick);
        const render::StageSettings s = Settings(host);
        const bool any = row.black || row.white || row.thick;
        EXPECT_EQ(s.scratchCount, row.count) << row.name;
        EXPECT_EQ(s.scratchSeed, row.seed) << row.name;
        EXPECT_EQ(s.scratchConstant, any ? 35 : 0) << row.name;
        EXPECT_EQ(s.scratchKinds, row.black * 1u + row.white * 2u + row.thick * 4u) << row.name;
    }
}

}  // namespace
}  // namespace velmora

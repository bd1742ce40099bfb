// The master settings: what the renderer asks an effect for at every frame. One row each, with group markers between
// them, in the order in which they are asked for. Hosts and effects refer to a setting by its index among the rows that
// are not markers.
#pragma once

#include <algorithm>
#include <array>
#include <cstdint>
#include <iterator>

#include "api/host_api.h"
#include "render/pictures.h"

namespace velmora {

// The settings' ids, in a different order from the rows.
enum class Master : std::uint32_t {
    kYJitter = 101,
    kXJitter = 102,
    kBorder = 103,
    kGlow = 201,
    kSaturation = 301,
    kFlicker = 302,
    kFlickerSpeed = 303,
    kBrightness = 304,
    kContrast = 305,
    kFilmGamma = 501,
    kTintColour = 502,
    kTint = 503,
    kWear = 601,
    kPattern = 602,
    kBlueChannelOnly = 603,
    kScratches = 701,
    kDepth = 702,
    kBlack = 704,
    kWhite = 705,
    kThick = 706,
    kSpots = 707,
};

enum class MasterKind : std::uint8_t { kBegin, kEnd, kInteger, kPercent, kColour, kMenu, kCheckBox };

struct MasterRow {
    std::uint32_t id;
    const char* name;
    MasterKind kind;
    float minimum;  // sliders
    float maximum;
    float
        value;  // before the first frame. Menu: item value; check box: 0 or 1; colours start as opaque black
    double
        neutral;  // the answer of an effect that does not use the setting. Slider: as shown; menu: item index

    [[nodiscard]] constexpr Master Setting() const { return Master{id}; }
    [[nodiscard]] constexpr bool IsSetting() const {
        return kind != MasterKind::kBegin && kind != MasterKind::kEnd;
    }
    // In the format that hosts exchange.
    [[nodiscard]] constexpr ParamKind HostKind() const {
        switch (kind) {
            case MasterKind::kInteger:
            case MasterKind::kPercent:
                return kKindSlider;
            case MasterKind::kColour:
                return kKindColour;
            case MasterKind::kMenu:
                return kKindMenu;
            case MasterKind::kCheckBox:
                return kKindCheckBox;
            case MasterKind::kBegin:
            case MasterKind::kEnd:
                break;
        }
        return kKindGroup;
    }
};

namespace master_table {

constexpr MasterRow Begin(std::uint32_t id, const char* name) {
    return {id, name, MasterKind::kBegin, 0, 0, 0, 0};
}
constexpr MasterRow End(std::uint32_t id) {
    return {id, "", MasterKind::kEnd, 0, 0, 0, 0};
}
constexpr MasterRow Row(Master setting, const char* name, MasterKind kind, float minimum, float maximum,
                        float value, double neutral) {
    return {static_cast<std::uint32_t>(setting), name, kind, minimum, maximum, value, neutral};
}
constexpr double kOpaqueBlack = 0xFF000000;

using enum MasterKind;

// clang-format off
inline constexpr MasterRow kRows[] = {
    Begin(100, "Jitter"),
    //  setting                   name                 kind          min  max  value neutral
    Row(Master::kYJitter,         "Y Jitter",          kInteger,      0,  10,     2, 0),
    Row(Master::kXJitter,         "X Jitter",          kInteger,      0,  10,     2, 0),
    Row(Master::kBorder,          "Border",            kColour,       0,   0,     0, kOpaqueBlack),
    End(199),
    Begin(300, "Color"),
    Row(Master::kFlicker,         "Flicker",           kPercent,      0, 100,    16, 0),
    Row(Master::kFlickerSpeed,    "Flicker Speed",     kPercent,      0, 100, 24.5f, 0),
    Row(Master::kBrightness,      "Brightness",        kPercent,   -100, 100,     0, 0),
    Row(Master::kContrast,        "Contrast",          kPercent,   -100, 100,     0, 0),
    End(399),
    Begin(500, "Gamma"),
    Row(Master::kSaturation,      "Saturation",        kPercent,   -100, 100,     0, 0),
    Row(Master::kTintColour,      "Tint",              kColour,       0,   0,     0, kOpaqueBlack),
    Row(Master::kTint,            "Tint",              kPercent,   -100, 100,     0, 0),
    Row(Master::kFilmGamma,       "Film Gamma",        kPercent,      0, 100,     0, 0),
    End(599),
    Begin(200, "Blur"),
    Row(Master::kGlow,            "Glow",              kPercent,      0, 100,     9, 0),
    End(299),
    Begin(600, "Wear"),
    Row(Master::kWear,            "Wear",              kPercent,      0, 100,    12, 0),
    Row(Master::kPattern,         "Pattern",           kMenu,         0,   0,  2001, 1),
    Row(Master::kBlueChannelOnly, "Blue Channel Only", kCheckBox,     0,   0,     0, 0),
    End(699),
    Begin(700, "Damage"),
    Row(Master::kSpots,           "Spots",             kPercent,      0, 100,    20, 0),
    Row(Master::kScratches,       "Scratches",         kPercent,      0, 100, 36.5f, 0),
    Row(Master::kDepth,           "Depth",             kPercent,      0, 100,    37, 0),
    Row(Master::kBlack,           "Black",             kCheckBox,     0,   0,     1, 0),
    Row(Master::kWhite,           "White",             kCheckBox,     0,   0,     1, 0),
    Row(Master::kThick,           "Thick",             kCheckBox,     0,   0,     1, 0),
    End(799),
};
// clang-format on

}  // namespace master_table

inline constexpr const auto& kMasterRows = master_table::kRows;
inline constexpr std::uint32_t kMasterCount = static_cast<std::uint32_t>(std::count_if(
    std::begin(kMasterRows), std::end(kMasterRows), [](const MasterRow& row) { return row.IsSetting(); }));
static_assert(kMasterCount == 21 && std::size(kMasterRows) == 33);

// The items of the "Pattern" menu: item i has the value 2000 + i and shows the wear picture of that value.
enum class Pattern : std::uint32_t { kWavy, kBlotchy, kGrainy, kFine, kSplotchy, kLite, kCrackly };
inline constexpr std::int32_t kFirstPatternValue = 2000;

namespace master_table {

struct PatternRow {
    Pattern pattern;
    const char* text;
};

using enum Pattern;

inline constexpr PatternRow kPatterns[] = {
    {kWavy, "Wavy"},         {kBlotchy, "Blotchy"}, {kGrainy, "Grainy"},   {kFine, "Fine"},
    {kSplotchy, "Splotchy"}, {kLite, "Lite"},       {kCrackly, "Crackly"},
};
static_assert(std::size(kPatterns) == render::kWearPictureCount, "one row for each wear picture");

template <std::size_t kCount>
consteval std::array<const char*, kCount> TextsInOrder(const PatternRow (&rows)[kCount]) {
    std::array<const char*, kCount> texts{};
    for (std::size_t i = 0; i < kCount; ++i) {
        if (rows[i].pattern != Pattern{static_cast<std::uint32_t>(i)}) throw "the patterns are out of order";
        texts[i] = rows[i].text;
    }
    return texts;
}

}  // namespace master_table

// The menu's texts, in item order.
inline constexpr auto kPatternItems = master_table::TextsInOrder(master_table::kPatterns);

}  // namespace velmora

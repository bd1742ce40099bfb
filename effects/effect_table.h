// What distinguishes the effects: their parameters, their presets and how each of the renderer's settings is answered.
// An effect consists of these tables alone; they are constant and shared by all its instances.
#pragma once

#include <array>
#include <cstdint>
#include <span>

#include "api/host_api.h"
#include "effects/master_table.h"

namespace velmora::effects {

struct Layout {
    std::int32_t x, y, width, height;
};

// One parameter as the host sees it.
struct ParamRow {
    const char* name;
    ParamKind kind;
    float minimum;  // shown range of a slider
    float maximum;
    ValueWord defaultValue;  // stored format: normalised number, colour word, item index, flag
    Layout layout;
    bool isGroupEnd;                     // group markers only
    std::span<const char* const> items;  // menus only
    std::uint32_t groupWord;             // group markers only: fills their cells in every preset
};

// How a setting of the renderer is answered: from one of the effect's own parameters or by a fixed value in the format
// of the setting's kind.
struct MasterAnswer {
    enum class Source : std::uint8_t {
        kOwn,      // own parameter `own`
        kWord,     // fixed: a number, a colour or an item index
        kFlag,     // fixed: only the first byte is written
        kDepthOf,  // 1 - (1 - s)^2 of own parameter `own`
    };
    Source source;
    std::uint32_t own;
    ValueWord fixed;
};

struct EffectTable {
    const char* name;
    std::span<const ParamRow> params;
    std::span<const char* const> presetNames;        // alphabetical
    std::span<const PresetCell> presetCells;         // preset major: [preset * params.size() + parameter]
    std::array<MasterAnswer, kMasterCount> answers;  // by master index
    bool marksSliders;                               // writes 1 after a slider's maximum
};

// The five effects in the order in which the library lists them.
extern const EffectTable kFilmCamera;
extern const EffectTable kFilmLook;
extern const EffectTable kFilmDamage;
extern const EffectTable kFilmExpress;
extern const EffectTable kFilmPro;
inline constexpr std::array<const EffectTable*, 5> kAllEffects = {&kFilmCamera, &kFilmLook, &kFilmDamage,
                                                                  &kFilmExpress, &kFilmPro};
static_assert(kAllEffects.size() == kEffectCount, "an index for each effect in api/host_api.h");

}  // namespace velmora::effects

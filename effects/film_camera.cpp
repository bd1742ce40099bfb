// The parameters and built-in presets of "Film Camera": an unsteady camera or projector. Jitter with a border for the
// uncovered edge, and flicker. The colour stages stay neutral and nothing is damaged.
#include "effects/table_builder.h"

namespace velmora::effects {
namespace {

using namespace tables;

// clang-format off

// Hosts lay these controls out at their natural size: widths and heights are 0.
constexpr ParamRow kParams[] = {
    //          name                   min   max    default     x    y  width height
    Slider(     "Y Jitter",              0,  10,         0,  {  0,   0,   0,   0}),
    Slider(     "X Jitter",              0,  10,         0,  { 66,   0,   0,   0}),
    Colour(     "Border",                      0xFF000000,  {132,   0,   0,   0}),
    Slider(     "Flicker",               0, 100,         0,  {  0,  90,   0,   0}),
    Slider(     "Flicker Rate",          0, 100,         0,  { 66,  90,   0,   0}),
};

// "Earthquake!" and "Newsreel from the War Front" are the same on purpose.
constexpr PresetRow<5> kPresets[] = {
    //                                         Y       X                       Flicker
    //                                    Jitter  Jitter      Border  Flicker     Rate
    Preset("Earthquake!",                     10,     10, 0xFF000000,    61.5,    19.5),
    Preset("Electrical Storm",               0.6,   0.65, 0xFF000000,      75,      97),
    Preset("Fire Light",                       0,      0, 0x00C0C0C0,    30.5,      26),
    Preset("Hand Cranked Camera",            2.6,   2.95, 0xFF000000,    61.5,    19.5),
    Preset("Newsreel from the War Front",     10,     10, 0xFF000000,    61.5,    19.5),
    Preset("Reset To None",                    0,      0, 0xFF000000,       0,       0),
    Preset("Slight Camera Shake",           0.55,   0.45, 0xFF000000,     9.5,      67),
    Preset("Train Ride",                     0.6,    4.9, 0xFF000000,      29,      14),
};

// clang-format on

constexpr AnswerRow kSettings[] = {
    Own(Master::kFlickerSpeed, "Flicker Rate"),
};

constexpr auto kPresetNames = NamesOf(kPresets);
constexpr auto kPresetCells = StorePresets(kParams, kPresets);

}  // namespace

constexpr EffectTable kFilmCamera = {.name = "Film Camera",
                                     .params = kParams,
                                     .presetNames = kPresetNames,
                                     .presetCells = kPresetCells,
                                     .answers = MapSettings(kParams, kSettings),
                                     .marksSliders = false};

}  // namespace velmora::effects

// The parameters and built-in presets of "Film Damage": wear, spots and scratches on a picture that otherwise stays as
// it is.
#include "effects/table_builder.h"

namespace velmora::effects {
namespace {

using namespace tables;

// clang-format off

// The two "Scratches" markers differ in width on purpose.
// A group marker's number is the content of its cell in every preset.
constexpr ParamRow kParams[] = {
    //          name                   min   max    default     x    y  width height
    Slider(     "Wear",                  0, 100,         0,  {  0,   0,   0,   0}),
    Menu(       "Pattern",         kPatternItems, kBlotchy,  { 66,   0,  95,  50}),
    CheckBox(   "Blue Channel Only",                 kOff,  { 66,  55, 110,   0}),
    Slider(     "Spots",                 0, 100,         0,  {180,   0,   0,   0}),
    GroupBegin( "Scratches",                   0x3F0CCCCD,  {  0,  90, 212, 105}),
    Slider(     "Density",               0, 100,         0,  { 11, 105,   0,   0}),
    Slider(     "Depth",                 0, 100,         0,  { 82, 105,   0,   0}),
    CheckBox(   "Black",                              kOn,  {154, 105,  60,   0}),
    CheckBox(   "White",                              kOn,  {154, 130,  60,   0}),
    CheckBox(   "Thick",                              kOn,  {154, 155,  60,   0}),
    GroupEnd(   "Scratches",                   0x00000000,  {  0,  90, 227, 105}),
};

// "Reset To None" switches off the kinds of scratch that the parameters' defaults switch on.
constexpr PresetRow<9> kPresets[] = {
    //                                         Blue
    //                                      Channel
    //                      Wear   Pattern     Only  Spots  Density  Depth  Black  White  Thick
    Preset("Aged",            33,  kGrainy,    kOff,  48.5,      20,  60.5,   kOn,   kOn,  kOff),
    Preset("Bleached",        61, kBlotchy,    kOff,    98,      34,    87,  kOff,   kOn,   kOn),
    Preset("Dirty",           22, kBlotchy,    kOff,   100,      24,  65.5,   kOn,   kOn,   kOn),
    Preset("Mostly Dirt",      7, kBlotchy,    kOff,   100,    29.5,  24.5,  kOff,   kOn,  kOff),
    Preset("Reset To None",    0, kBlotchy,    kOff,     0,       0,     0,  kOff,  kOff,  kOff),
    Preset("Shredded",      31.5, kBlotchy,    kOff,  39.5,     100,   100,   kOn,   kOn,   kOn),
    Preset("Snowy",         66.5,  kGrainy,    kOff,     0,       0,     0,  kOff,  kOff,  kOff),
    Preset("Water Damage",    89,    kWavy,     kOn,  74.5,    38.5,  42.5,   kOn,  kOff,  kOff),
};

// clang-format on

constexpr AnswerRow kSettings[] = {
    Own(Master::kScratches, "Density"),
};

constexpr auto kPresetNames = NamesOf(kPresets);
constexpr auto kPresetCells = StorePresets(kParams, kPresets);

}  // namespace

constexpr EffectTable kFilmDamage = {.name = "Film Damage",
                                     .params = kParams,
                                     .presetNames = kPresetNames,
                                     .presetCells = kPresetCells,
                                     .answers = MapSettings(kParams, kSettings),
                                     .marksSliders = true};

}  // namespace velmora::effects

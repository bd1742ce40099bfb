// The parameters and built-in presets of "Film Express": camera, look and damage with few controls. One jitter for both
// directions, flicker at a fixed speed, and a scratch depth that follows the amount of scratches; all kinds of scratch
// are on.
#include "effects/table_builder.h"

namespace velmora::effects {
namespace {

using namespace tables;

// clang-format off

// A group marker's number is the content of its cell in every preset.
constexpr ParamRow kParams[] = {
    //          name                   min   max    default     x    y  width height
    GroupBegin( "Camera",                      0x3E6147AE,  {  0,   0,  66, 190}),
    Slider(     "Jitter",                0,  10,         0,  {  9,  15,   0,   0}),
    Slider(     "Flicker",               0, 100,         0,  {  9, 105,   0,   0}),
    GroupEnd(   "Camera",                      0x3F3EB852,  {  0,   0,  66, 190}),
    GroupBegin( "Look",                        0x3F0CCCCD,  { 77,   0, 132, 190}),
    Colour(     "Tint",                        0xFF000000,  { 85,  15,   0,   0}),
    Slider(     "Tint",               -100, 100,         0,  {151,  15,   0,   0}),
    Slider(     "Saturation",         -100, 100,         0,  { 85, 105,   0,   0}),
    Slider(     "Film Gamma",            0, 100,         0,  {151, 105,   0,   0}),
    GroupEnd(   "Look",                        0x00000001,  { 77,   0, 132, 190}),
    GroupBegin( "Damage",                      0x00000000,  {  0, 195, 209, 105}),
    Slider(     "Wear",                  0, 100,         0,  {  9, 210,   0,   0}),
    Slider(     "Spots",                 0, 100,         0,  { 80, 210,   0,   0}),
    Slider(     "Scratches",             0, 100,         0,  {151, 210,   0,   0}),
    GroupEnd(   "Damage",                      0x00000000,  {  0, 195, 209, 105}),
};

constexpr PresetRow<9> kPresets[] = {
    //                                             Tint                     Film
    //                      Jitter  Flicker      colour  Tint  Saturation  Gamma  Wear  Spots  Scratches
    Preset("60's Memories",      3,    17.5, 0x0080FFFF,   53,         27,  61.5,    9,    26,        20),
    Preset("Green Dream",        0,      20, 0x0000FF80,  100,        100,    34,    0,     0,         0),
    Preset("Hades",            1.9,      84, 0x005555E8,  100,        -36,  77.5, 10.5,    36,         0),
    Preset("Home Movie",       1.8,    11.5, 0x00F0DCCC,   35,        -47,  62.5, 28.5,    56,      36.5),
    Preset("Horror Movie",    2.25,      33, 0x0080FFFF,  -54,        -65,   100,   33,     0,         0),
    Preset("Newsreel",        4.95,      47, 0x00FF8900,  -54,       -100,  86.5, 39.5,  71.5,      81.5),
    Preset("Old Film",        2.85,    29.5, 0x00FF8900, -100,       -100,  86.5,   26,  35.5,      56.5),
    Preset("Reset To None",      0,       0, 0x00FFFFFF,    0,          0,     0,    0,     0,         0),
    Preset("Unusable",          10,      85, 0x005555E8,    0,          0,     0, 93.5,   100,       100),
    Preset("Violence",          10,       0, 0x005555E8,    0,          0,     0,    0,     0,         0),
    Preset("Vivid",              0,       0, 0x00F0DCCC,   23,        100,  98.5,    0,     0,         0),
};

// clang-format on

constexpr AnswerRow kSettings[] = {
    Own(Master::kYJitter, "Jitter"),      Own(Master::kXJitter, "Jitter"), Fixed(Master::kFlickerSpeed, 0.2),
    DepthOf(Master::kDepth, "Scratches"), Fixed(Master::kBlack, kOn),      Fixed(Master::kWhite, kOn),
    Fixed(Master::kThick, kOn),
};

constexpr auto kPresetNames = NamesOf(kPresets);
constexpr auto kPresetCells = StorePresets(kParams, kPresets);

}  // namespace

constexpr EffectTable kFilmExpress = {.name = "Film Express",
                                      .params = kParams,
                                      .presetNames = kPresetNames,
                                      .presetCells = kPresetCells,
                                      .answers = MapSettings(kParams, kSettings),
                                      .marksSliders = false};

}  // namespace velmora::effects

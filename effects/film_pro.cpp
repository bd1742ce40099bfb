// The parameters and built-in presets of "Film Pro": camera, look and damage with nearly every setting as a control. Only
// the border colour and wear in the blue channel alone are fixed.
#include "effects/table_builder.h"

namespace velmora::effects {
namespace {

using namespace tables;

// clang-format off

// A begin marker carries a placeholder; the end marker holds the frame drawn round its group.
// A group marker's number is the content of its cell in every preset.
constexpr ParamRow kParams[] = {
    //          name                   min   max    default     x    y  width height
    GroupBegin( "Camera",                      0x3E6147AE,  {  0,   0, 300, 100}),
    Slider(     "Y Jitter",              0,  10,         0,  { 11,  15, 198,  30}),
    Slider(     "X Jitter",              0,  10,         0,  { 77,  15, 198,  30}),
    Slider(     "Flicker",               0, 100,         0,  {143,  15, 198,  30}),
    Slider(     "Flicker Rate",          0, 100,         0,  {209,  15, 198,  30}),
    GroupEnd(   "Camera",                      0x00E55500,  {  0,   0, 267, 110}),
    GroupBegin( "Look",                        0x00000000,  {  0,   0, 300, 100}),
    Colour(     "Tint",                        0xFF000000,  { 11, 130, 198,  30}),
    Slider(     "Tint",               -100, 100,         0,  { 77, 130, 198,  30}),
    Slider(     "Saturation",         -100, 100,         0,  {143, 130, 198,  30}),
    Slider(     "Brightness",         -100, 100,         0,  { 11, 220, 198,  30}),
    Slider(     "Contrast",           -100, 100,         0,  { 77, 220, 198,  30}),
    Slider(     "Film Gamma",            0, 100,         0,  {143, 220, 198,  30}),
    Slider(     "Diffusion",             0, 100,         0,  {209, 220, 198,  30}),
    GroupEnd(   "Look",                        0x00000000,  {  0, 115, 267, 200}),
    GroupBegin( "Damage",                      0x00000000,  {  0,   0, 300, 100}),
    Slider(     "Wear",                  0, 100,         0,  {290,  15, 198,  30}),
    Slider(     "Spots",                 0, 100,         0,  {356,  15, 198,  30}),
    Menu(       "Pattern",         kPatternItems, kBlotchy,  {290, 105, 112,  20}),
    GroupEnd(   "Damage",                      0x00000000,  {280,   0, 134, 155}),
    GroupBegin( "Scratches",                   0x00000000,  {  0,   0, 300, 100}),
    Slider(     "Density",               0, 100,         0,  {290, 175, 198,  30}),
    Slider(     "Depth",                 0, 100,         0,  {356, 175, 198,  30}),
    CheckBox(   "Black",                             kOff,  {290, 265,  60,  10}),
    CheckBox(   "White",                             kOff,  {356, 265,  60,  10}),
    CheckBox(   "Thick",                             kOff,  {290, 290,  60,  10}),
    GroupEnd(   "Scratches",                   0x00000000,  {280, 160, 134, 155}),
};

constexpr PresetRow<19> kPresets[] = {
    //                              Y       X           Flicker        Tint                                           Film
    //                         Jitter  Jitter  Flicker     Rate      colour  Tint  Saturation  Brightness  Contrast  Gamma  Diffusion  Wear  Spots    Pattern  Density  Depth  Black  White  Thick
    Preset("Bleached",              0,      0,       0,       0, 0x00FFFFFF,   44,        -53,         10,      -34,  81.5,      34.5,   42,     0,  kBlotchy,    35.5,  28.5,  kOff,   kOn,  kOff),
    Preset("Blue",                  0,      0,       0,       0, 0x00FF8000,   93,       -100,         27,       -6,   100,      44.5,    0,     0,  kBlotchy,       0,     0,   kOn,   kOn,   kOn),
    Preset("Burnt",                 0,      0,       5,    17.5, 0x0046BAFB,   96,        -65,          7,       41,    75,      48.5,    0,     0,  kBlotchy,       0,     0,  kOff,  kOff,  kOff),
    Preset("Dark Flickering",       0,      0,      24,    99.5, 0x00CFC27A,   30,        -58,       -100,      100,    51,        79,    0,     0,  kBlotchy,       0,     0,  kOff,  kOff,  kOff),
    Preset("Deep Purple",           0,      0,     6.5,    22.5, 0x00800080,   79,        -66,        -13,        0,    64,        65,    0,     0,  kBlotchy,       0,     0,  kOff,  kOff,  kOff),
    Preset("Film Noir",             0,      0,    10.5,      12, 0x00FF7B00,   -1,       -100,        -29,       58,   100,        85,   15,  21.5,  kBlotchy,       9,    13,  kOff,  kOff,  kOff),
    Preset("Fire Light",            0,      0,    27.5,    44.5, 0x0052A4ED,  100,          0,        -55,        0,    66,      22.5,    0,     0,  kBlotchy,    17.5,  26.5,  kOff,  kOff,  kOff),
    Preset("Fog",                   0,      0,      28,     6.5, 0x00FFFFFF,    0,        -42,         48,     -100,     0,      28.5,   26,     0,     kFine,       0,     0,  kOff,  kOff,  kOff),
    Preset("Night Vision",          0,      0,      23,    12.5, 0x0000FF00,  100,       -100,        -61,      -55,    68,         0,   16,     0,  kBlotchy,       0,     0,  kOff,  kOff,  kOff),
    Preset("Nightmare",             0,      0,    59.5,     100, 0x00CFC27A,  100,        100,        -70,      100,   100,         0,    0,     0,  kBlotchy,       0,     0,  kOff,  kOff,  kOff),
    Preset("Oldie",               2.1,    2.4,       0,       0, 0x00FF7B00,  -44,       -100,          0,        0,   100,      12.5,   22,  49.5,  kBlotchy,      47,  33.5,   kOn,  kOff,  kOff),
    Preset("Olive",                 0,      0,       0,       0, 0x0026CAB6,   93,       -100,         27,       -6,   100,      44.5,    0,     0,  kBlotchy,       0,     0,   kOn,   kOn,   kOn),
    Preset("Red",                   0,      0,       0,       0, 0x000000FF,   93,       -100,         27,       -6,  69.5,      44.5,    0,     0,  kBlotchy,       0,     0,   kOn,   kOn,   kOn),
    Preset("Reset To None",         0,      0,       0,       0, 0x00FFFFFF,    0,          0,          0,        0,     0,         0,    0,     0,  kBlotchy,       0,     0,  kOff,  kOff,  kOff),
    Preset("Saturated Glare",       0,      0,    19.5,    15.5, 0x0046BAFB, -100,        100,         46,      100,   100,        43,    0,     0,  kBlotchy,       0,     0,  kOff,  kOff,  kOff),
    Preset("Sci Fi Explosion",     10,    4.3,    84.5,    59.5, 0x00000000, -100,       -100,          0,      -26,  60.5,         0,    0,     0,  kBlotchy,       0,     0,  kOff,  kOff,  kOff),
    Preset("Sci Fi Future",         0,      0,       0,       0, 0x00CFC27A,  100,        -51,        -23,       17,    71,      71.5,    0,     0,  kBlotchy,       0,     0,  kOff,  kOff,  kOff),
    Preset("Seattle",               0,      0,       0,       0, 0x0079ABC6, -100,        -62,        -29,      -86,    47,        47,    0,     0,  kBlotchy,     100,    20,  kOff,   kOn,  kOff),
    Preset("Storm Footage",       1.9,      2,     100,    72.5, 0x00FCC193,   53,         10,          0,      -47,  17.5,      41.5,   56,     0, kSplotchy,      41,  42.5,  kOff,   kOn,  kOff),
    Preset("Super 8",             0.6,   0.25,      10,     7.5, 0x00398FE6,   31,         20,        -31,       25,  63.5,        19,   30,  41.5,   kGrainy,      27,  36.5,  kOff,  kOff,   kOn),
    Preset("Ultraviolet",           0,      0,       0,       0, 0x0000FFFF, -100,         17,        -25,      -79,    97,        37,    0,     0,  kBlotchy,       0,     0,  kOff,  kOff,  kOff),
    Preset("Very Old Footage",    1.9,    1.2,      34,      27, 0x00FF6800, -100,       -100,        -19,      100,   100,       100,   10,    55,  kBlotchy,      27,  50.5,  kOff,  kOff,   kOn),
    Preset("Wholesome Warmth",      0,      0,       0,       0, 0x0046BAFB,   35,         30,          0,       -9,    50,         0,    0,     0,  kBlotchy,       0,     0,  kOff,  kOff,  kOff),
    Preset("Worn Color Print",   1.25,    1.1,      15,    11.5, 0x00FFFFFF,    0,        -68,          0,        0,     0,         0, 21.5,    94,  kBlotchy,      40,  60.5,   kOn,   kOn,   kOn),
};

// clang-format on

constexpr AnswerRow kSettings[] = {
    Own(Master::kFlickerSpeed, "Flicker Rate"),
    Own(Master::kGlow, "Diffusion"),
    Own(Master::kScratches, "Density"),
};

constexpr auto kPresetNames = NamesOf(kPresets);
constexpr auto kPresetCells = StorePresets(kParams, kPresets);

}  // namespace

constexpr EffectTable kFilmPro = {.name = "Film Pro",
                                  .params = kParams,
                                  .presetNames = kPresetNames,
                                  .presetCells = kPresetCells,
                                  .answers = MapSettings(kParams, kSettings),
                                  .marksSliders = false};

}  // namespace velmora::effects

// The parameters and built-in presets of "Film Look": colour grading. Tint, saturation, brightness, contrast, film gamma
// and diffusion, without movement or damage.
#include "effects/table_builder.h"

namespace velmora::effects {
namespace {

using namespace tables;

// clang-format off

constexpr ParamRow kParams[] = {
    //          name                   min   max    default     x    y  width height
    Colour(     "Tint",                        0xFF000000,  {  0,   0, 198,  30}),
    Slider(     "Tint",               -100, 100,         0,  { 66,   0, 198,  30}),
    Slider(     "Saturation",         -100, 100,         0,  {132,   0, 198,  30}),
    Slider(     "Brightness",         -100, 100,         0,  {  0,  90, 198,  30}),
    Slider(     "Contrast",           -100, 100,         0,  { 66,  90, 198,  30}),
    Slider(     "Film Gamma",            0, 100,         0,  {132,  90, 198,  30}),
    Slider(     "Diffusion",             0, 100,         0,  {198,  90, 198,  30}),
};

// "Flourescent Light" keeps the spelling that users know: saved projects refer to presets by name.
constexpr PresetRow<7> kPresets[] = {
    //                                Tint                                           Film
    //                              colour  Tint  Saturation  Brightness  Contrast  Gamma  Diffusion
    Preset("Black N White",     0x00000000,    0,       -100,          0,        0,   100,         0),
    Preset("Bleached",          0x00FFFFFF,   49,        -57,         11,      -23,    85,      32.5),
    Preset("Bright Colors",     0x000270A4,    0,         61,          0,        0,  84.5,         0),
    Preset("Cafe",              0x00EA7B6F,   34,         39,         13,        0,  43.5,      38.5),
    Preset("Cool",              0x00857334,   96,        -36,          0,      -10,  15.5,         4),
    Preset("Diffusion",         0x005CA7EB,    0,          0,        -10,        0,  21.5,       100),
    Preset("Earth",             0x000270A4,   51,        -52,          0,        0,    58,        16),
    Preset("Ektachrome",        0x005CA7EB,  -84,         -8,          0,      -19,    52,      22.5),
    Preset("Faded",             0x00A38852,    0,        -74,         15,     -100,   100,        15),
    Preset("Film Noir",         0x000270A4,   40,       -100,        -35,       44,   100,        61),
    Preset("Flourescent Light", 0x008DEA6F,  100,         -6,          0,        0,  25.5,        14),
    Preset("Godmother",         0x0071A6D7,   66,        -16,        -19,      -10,  80.5,        12),
    Preset("Heat",              0x004A4AFF,  100,         56,       -100,      -63,   100,       100),
    Preset("Ice",               0x000000FF,  -51,        -31,        -13,       26,  43.5,        56),
    Preset("Kodachrome",        0x005CA7EB,   36,          9,          0,      -19,    63,         0),
    Preset("Misery",            0x00808000,  100,        -13,        -18,      -52,  20.5,        46),
    Preset("Moonlight",         0x00A38852,  100,        -85,        -56,       49,   100,        76),
    Preset("Night",             0x00FC8E07,   47,        -83,        -45,       10,   100,      22.5),
    Preset("Pink Tone",         0x00C52ED1,   49,          8,         11,      -23,     0,         0),
    Preset("Posterize",         0x00A38852,  100,        100,          0,      100,   100,         0),
    Preset("Reset To None",     0x00FFFFFF,    0,          0,          0,        0,     0,         0),
    Preset("Rust",              0x001B7AE4,   46,        -31,        -13,       26,  43.5,        36),
    Preset("Saturated Colors",  0x00A38852, -100,        100,         -5,     -100,   100,       2.5),
    Preset("Scalding Hot",      0x002942CB,  100,         91,          0,        6,   100,         0),
    Preset("Sci Fi Future",     0x00E1CF99,  100,        -50,        -23,       16,  72.5,        73),
    Preset("Sepia",             0x000270A4,  100,       -100,          0,        0,    44,         0),
    Preset("Smoggy Day",        0x0089AEBE,  100,        -43,          0,      -81,   9.5,         0),
    Preset("Sodium Lights",     0x0000BBF9,  100,       -100,        -13,       61,    38,         0),
    Preset("Warm",              0x00EA7B6F, -100,         39,          8,        0,     0,        14),
    Preset("Washed Out",        0x00F4F3E8,  100,        -28,         52,       80,   100,         0),
};

// clang-format on

constexpr AnswerRow kSettings[] = {
    FixedColour(Master::kBorder, 0x00000000),  // no top byte, unlike the others; no border shows
    Own(Master::kGlow, "Diffusion"),
};

constexpr auto kPresetNames = NamesOf(kPresets);
constexpr auto kPresetCells = StorePresets(kParams, kPresets);

}  // namespace

constexpr EffectTable kFilmLook = {.name = "Film Look",
                                   .params = kParams,
                                   .presetNames = kPresetNames,
                                   .presetCells = kPresetCells,
                                   .answers = MapSettings(kParams, kSettings),
                                   .marksSliders = false};

}  // namespace velmora::effects

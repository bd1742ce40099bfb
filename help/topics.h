// The numbered topics of the user help. A dialog passes the number to the help viewer, which opens the page.
// The page is named after the constant: kFilmLook is docs/help/film-look.html. The build makes the map of the compiled
// help from this list (one constant per line); the numbers are defined nowhere else. A number that has been released
// keeps its meaning, because hosts may store it.
#pragma once

namespace velmora::help {

inline constexpr int kStart = 100;

// The effects.
inline constexpr int kFilmCamera = 101;
inline constexpr int kFilmLook = 102;
inline constexpr int kFilmDamage = 103;
inline constexpr int kFilmExpress = 104;
inline constexpr int kFilmPro = 105;

// The controls, in the order in which they are applied to the picture.
inline constexpr int kJitter = 201;
inline constexpr int kBorder = 202;
inline constexpr int kDiffusion = 203;
inline constexpr int kFlicker = 204;
inline constexpr int kFlickerRate = 205;
inline constexpr int kBrightness = 206;
inline constexpr int kContrast = 207;
inline constexpr int kSaturation = 208;
inline constexpr int kTint = 209;
inline constexpr int kFilmGamma = 210;
inline constexpr int kWear = 211;
inline constexpr int kPattern = 212;
inline constexpr int kBlueChannelOnly = 213;
inline constexpr int kScratches = 214;
inline constexpr int kDepth = 215;
inline constexpr int kScratchKinds = 216;
inline constexpr int kSpots = 217;

inline constexpr int kOptions = 300;

inline constexpr int kPresets = 310;
inline constexpr int kSavingAndLoading = 311;

inline constexpr int kReelView = 320;

inline constexpr int kTrouble = 400;

}  // namespace velmora::help

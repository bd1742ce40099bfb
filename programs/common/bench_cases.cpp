#include "programs/common/bench_cases.h"

namespace velmora::bench {
namespace {

// clang-format off
constexpr CaseValue kCameraBoth[]   = {{0, 0.6}, {1, 0.6}, {3, 0.6}, {4, 0.2}};
constexpr CaseValue kCameraJitter[] = {{0, 0.6}, {1, 0.6}};
constexpr double kSepia = 0x000270A4;
constexpr CaseValue kLookTables[]   = {{0, kSepia}, {1, 0.9}, {3, 0.45}, {4, 0.6}, {5, 0.44}};
constexpr CaseValue kLookMix[]      = {{0, kSepia}, {1, 0.9}, {2, 0.3}, {3, 0.45}, {4, 0.6}, {5, 0.44}};
constexpr CaseValue kLookGlow[]     = {{0, kSepia}, {1, 0.9}, {2, 0.3}, {3, 0.45}, {4, 0.6}, {5, 0.44}, {6, 0.5}};
constexpr CaseValue kDamage[]       = {{0, 0.33}, {1, 2}, {3, 1}, {5, 1}, {6, 0.6}, {7, 1}, {8, 1}, {9, 1}};
constexpr CaseValue kPro[] = {
    {1, 0.6}, {2, 0.6}, {3, 0.34}, {4, 0.27}, {7, kSepia}, {8, 0.9}, {9, 0.3}, {10, 0.45}, {11, 0.6}, {12, 0.44},
    {16, 0.33}, {17, 1}, {18, 2}, {21, 1}, {22, 0.6}, {23, 1}, {24, 1}, {25, 1}};
constexpr CaseValue kProGlow[] = {
    {1, 0.6}, {2, 0.6}, {3, 0.34}, {4, 0.27}, {7, kSepia}, {8, 0.9}, {9, 0.3}, {10, 0.45}, {11, 0.6}, {12, 0.44},
    {13, 0.5}, {16, 0.33}, {17, 1}, {18, 2}, {21, 1}, {22, 0.6}, {23, 1}, {24, 1}, {25, 1}};

constexpr BenchCase kCases[] = {
    // name                                          effect  values       goal: native  DLL  below AVX2
    {"Film Camera, jitter and flicker",                   0, kCameraBoth,         1.6, 2.0, 0},
    {"Film Camera, jitter only",                          0, kCameraJitter,       1.0, 1.1, 0},
    {"Film Look, tables only",                            1, kLookTables,         1.4, 1.5, 1.7},
    {"Film Look, with saturation",                        1, kLookMix,            2.2, 2.1, 3.2},
    {"Film Look, with diffusion",                         1, kLookGlow,           4.4, 3.8, 6.0},
    {"Film Damage, wear, 25 spots, 16 scratches",         2, kDamage,             1.3, 1.1, 1.5},
    {"Film Pro, everything but diffusion",                4, kPro,                3.0, 2.7, 4.2},
    {"Film Pro, everything",                              4, kProGlow,            5.2, 4.7, 7.0},
    {"neutral settings",                                  4, {},                  1.0, 1.0, 0},
};
// clang-format on

}  // namespace

std::span<const BenchCase> BenchCases() noexcept {
    return kCases;
}

const BenchCase& EverythingCase() noexcept {
    return kCases[7];
}

std::string TitleOf(const BenchCase& test, double goal) {
    const auto text = [](double number) { return std::to_string(number).substr(0, 3); };
    std::string title = test.name + std::string(" (goal ") + text(goal);
    if (test.goalBelow != 0) title += ", ssse3 " + text(test.goalBelow);
    return title + ")";
}

}  // namespace velmora::bench

// The curves between light and display values against the library's powers in double precision.

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <vector>

#include "render/deep/light.h"

namespace velmora::render {
namespace {

double Display(LightCurve curve, double x) {
    if (curve == LightCurve::kGamma) return std::copysign(std::pow(std::abs(x), 1 / 2.4), x);
    return x <= 0.0031308 ? 12.92 * x : 1.055 * std::pow(x, 1 / 2.4) - 0.055;
}
double Light(LightCurve curve, double x) {
    if (curve == LightCurve::kGamma) return std::copysign(std::pow(std::abs(x), 2.4), x);
    return x <= 0.04045 ? x / 12.92 : std::pow((x + 0.055) / 1.055, 2.4);
}

struct Way {
    double (*formula)(LightCurve, double);
    void (*run)(LightCurve, float*, std::int32_t, SimdLevel) noexcept;
};
constexpr Way kWays[] = {{Display, LightToDisplay}, {Light, DisplayToLight}};

// Four numbers for each of 16 bits, with an odd number of them, and far outside.
std::vector<float> Numbers() {
    std::vector<float> numbers;
    for (int i = 0; i <= 4 * 65535; ++i) numbers.push_back(static_cast<float>(i / (4.0 * 65535.0)));
    for (const float x : {1e-30f, 1e-12f, 1.5f, 4.0f, 100.0f, 65504.0f, 1e6f}) {
        numbers.push_back(x);
        numbers.push_back(-x);
    }
    return numbers;
}

TEST(LightCurves, AreTheFormulas) {
    const std::vector<float> numbers = Numbers();
    for (const LightCurve curve : {LightCurve::kSrgb, LightCurve::kGamma}) {
        for (const Way& way : kWays) {
            std::vector<float> plain;
            for (const SimdLevel level : kSimdLevels) {
                if (level > BestSimdLevel()) break;
                std::vector<float> results = numbers;
                way.run(curve, results.data(), static_cast<std::int32_t>(results.size()), level);
                if (level == SimdLevel::kPlain) plain = results;
                EXPECT_EQ(results, plain);
            }
            for (std::size_t i = 0; i < numbers.size(); ++i) {
                const double wanted = way.formula(curve, double{numbers[i]});
                ASSERT_NEAR(plain[i], wanted, 1e-6 * std::max(1.0, std::abs(wanted))) << numbers[i];
                if (i > 0 && i <= 4 * 65535) {
                    ASSERT_GE(plain[i], plain[i - 1]) << numbers[i];
                }
            }
        }
    }
}

TEST(LightCurves, AcceptAnything) {
    constexpr float kInfinity = std::numeric_limits<float>::infinity();
    for (const LightCurve curve : {LightCurve::kSrgb, LightCurve::kGamma}) {
        for (const Way& way : kWays) {
            float numbers[] = {std::numeric_limits<float>::quiet_NaN(), 0.0f, kInfinity, -kInfinity};
            way.run(curve, numbers, 4, BestSimdLevel());
            EXPECT_EQ(numbers[0], 0.0f);
            EXPECT_EQ(numbers[1], 0.0f);
            EXPECT_TRUE(std::isfinite(numbers[2]) && numbers[2] > 1e6f);
            EXPECT_TRUE(std::isfinite(numbers[3]) && numbers[3] < -1e6f);
        }
    }
}

}  // namespace
}  // namespace velmora::render

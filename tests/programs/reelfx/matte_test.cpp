#include "programs/reelfx/pictures/pictures.h"

#include <gtest/gtest.h>

#include <cmath>

namespace velmora::hosts {
namespace {

// Damage as the effects apply it, on one channel: `share` of the way to `target`.
double Damaged(double value, double share, double target) {
    return value + (target - value) * share;
}

TEST(Matte, HoldsWhatWasDoneToTheGround) {
    for (const double target : {0.0, 9.0, 100.0, 246.0, 255.0}) {
        for (int percent = 0; percent <= 100; percent += 4) {
            const double share = percent / 100.0;
            BgraPicture picture(1, 1);
            FillMatteGround(picture);
            std::uint8_t* pixel = picture.Row(0);
            for (int c = 0; c < 3; ++c) {
                pixel[c] = static_cast<std::uint8_t>(std::lround(Damaged(pixel[c], share, target)));
            }
            ReadMatte(picture);
            const double alpha = pixel[3] / 255.0;
            for (const double under : {0.0, 60.0, 128.0, 200.0, 255.0}) {
                // Three roundings: of the background, of alpha and of the grey.
                EXPECT_NEAR(Damaged(under, alpha, pixel[0]), Damaged(under, share, target), 1.6)
                    << target << " " << percent << " " << under;
            }
        }
    }
}

TEST(Matte, IsTransparentWhereNothingHappened) {
    BgraPicture picture(3, 2);
    FillMatteGround(picture);
    ReadMatte(picture);
    for (int i = 0; i < 12; ++i) EXPECT_EQ(picture.Row(1)[i], 0);
}

}  // namespace
}  // namespace velmora::hosts

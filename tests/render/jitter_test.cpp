#include "render/jitter.h"

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "tests/common/guarded_frame.h"

namespace velmora::render {
namespace {

using testing::Geometry;
using testing::GuardedFrame;

TEST(Jitter, DrawsNothingWhenBothAmplitudesAreZero) {
    Random random(77);
    EXPECT_FALSE(PrepareJitter({}, random).IsActive());
    EXPECT_EQ(random.State(), 77u);
}

TEST(Jitter, DrawsVerticallyFirstAndAlwaysTwice) {
    StageSettings settings;
    settings.yJitter = 2;
    Random random(77), plain(77);
    const JitterStage stage = PrepareJitter(settings, random);
    EXPECT_EQ(stage.Dy(), static_cast<std::int32_t>(plain.Next() * 4 / 32767) - 2);
    plain.Next();
    EXPECT_EQ(stage.Dx(), 0);
    EXPECT_EQ(random.State(), plain.State());
}

// Every shift of small pictures against the sentence "the pixel at (y, x) is the input's at (y - dy, x - dx),
// the border where there is none".
TEST(Jitter, ShiftsAndFillsWhateverTheSize) {
    constexpr std::uint32_t kBorder = 0x80112233u;
    for (const auto& [width, height] : {std::pair{7, 5}, {1, 1}, {3, 1}, {1, 4}}) {
        for (std::int32_t dy = -6; dy <= 6; ++dy) {
            for (std::int32_t dx = -8; dx <= 8; ++dx) {
                GuardedFrame source{Geometry{width, height, 2, 1, 3, true}};
                source.FillRandom(3);
                const ImageView view = ViewOf(source.Description(), width, height);
                const JitterStage stage(dy, dx, kBorder);
                std::vector<Bgra> scratch(static_cast<std::size_t>(width));
                for (std::int32_t y = 0; y < height; ++y) {
                    stage.Shifted(view, y).Copy(0, width, scratch.data());
                    for (std::int32_t x = 0; x < width; ++x) {
                        const std::int32_t fromY = y - dy, fromX = x - dx;
                        const bool inside = fromY >= 0 && fromY < height && fromX >= 0 && fromX < width;
                        const std::uint32_t expected = inside ? source.WordAt(fromY, fromX) : kBorder;
                        ASSERT_EQ(std::memcmp(scratch.data() + x, &expected, 4), 0)
                            << dy << ' ' << dx << ' ' << y << ' ' << x;
                    }
                }
            }
        }
    }
}

}  // namespace
}  // namespace velmora::render

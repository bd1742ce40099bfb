// Every built-in preset on deep pixels. On a picture of 8-bit values the deep frame must be the formula of every pixel,
// and the 8-bit frame must lie where the formula lies when each 8-bit stage rounds by half a level. On ramps of all
// 16-bit values the deep frame must be the formula too, so that it has no step that the formula has not.
//
//   deep_presets_test           checks; exit code 1 when a preset fails
//   deep_presets_test --table   prints the figures as Markdown

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <random>
#include <string_view>
#include <vector>

#include "effects/effect_session.h"
#include "render/deep/deep_renderer.h"
#include "render/kernels.h"
#include "tests/effects/deep_exact.h"

namespace velmora::effects {
namespace {

using testing::Colour;
using testing::ExactChain;

constexpr std::int32_t kWidth = 256, kHeight = 256;
constexpr std::size_t kPixels = std::size_t{kWidth} * kHeight;
constexpr double kTimes[] = {0.0, 1.0, 7.3};
// Of single precision in the deep stages, in levels of 255: a quarter of a step of 16 bits.
constexpr double kPrecision = 0.001;
// Diffusion's dither takes away or adds nearly a level; its layer is in integers.
constexpr double kGlowRounding = 1.15;

// Red, green, blue, alpha; 0..1.
using Picture = std::vector<float>;

// A frame of its own, as a session renders it with seed 0.
struct Frame {
    render::FrameContext context{kWidth, kHeight};
    render::RenderState state;

    explicit Frame(double seconds) {
        context.SetTime(seconds);
        state.random.Pin(0, context.FrameNumber());
        state.random.BeginFrame(context.FrameNumber());
    }
};

Picture RenderedDeep(const render::StageSettings& settings, Picture picture, double seconds) {
    Frame frame(seconds);
    render::DeepMemory memory;
    const render::DeepPicture pixels = {picture.data(), kWidth * 16};
    if (!RenderDeep(render::DeepFrame::Whole(kWidth, kHeight, {}, pixels, pixels), frame.context, settings,
                    frame.state, memory))
        std::abort();
    return picture;
}

// In 8 bits.
Picture RenderedBytes(const render::StageSettings& settings, const Picture& picture, double seconds) {
    std::vector<render::Bgra> source(kPixels), result(kPixels);
    const auto byte = [&picture](std::size_t i) {
        return static_cast<std::uint8_t>(std::lround(picture[i] * 255.0f));
    };
    for (std::size_t i = 0; i < kPixels; ++i)
        source[i] = {byte(4 * i + 2), byte(4 * i + 1), byte(4 * i), byte(4 * i + 3)};
    Frame frame(seconds);
    render::FrameContext context({source.data(), kWidth, kHeight, kWidth * 4, 0, 0},
                                 {result.data(), kWidth, kHeight, kWidth * 4, 0, 0});
    context.SetTime(seconds);
    RenderStages(context, settings, frame.state);
    context.Finish();
    Picture rendered(4 * kPixels);
    for (std::size_t i = 0; i < kPixels; ++i) {
        const render::Bgra p = result[i];
        const std::uint8_t four[] = {p.red, p.green, p.blue, p.alpha};
        for (std::size_t c = 0; c < 4; ++c) rendered[4 * i + c] = static_cast<float>(four[c]) / 255.0f;
    }
    return rendered;
}

// Gradients, noise, waves and blocks of 8-bit values.
Picture Bytes() {
    Picture picture(4 * kPixels);
    std::mt19937 numbers(5);
    for (std::size_t i = 0; i < picture.size(); ++i) {
        const std::size_t x = i / 4 % kWidth, y = i / 4 / kWidth, channel = i % 4;
        const double wave = 127.5 + 127.5 * std::sin(static_cast<double>(x * (channel + 1)) * 0.05 +
                                                     static_cast<double>(y) * 0.1);
        const std::size_t values[] = {x, numbers() % 256, static_cast<std::size_t>(wave),
                                      (x / 16 * 16 + channel * 30 + y) % 256};
        picture[i] = static_cast<float>(values[y / 64]) / 255.0f;
    }
    return picture;
}

// Rises from `first` by a 65535th from pixel to pixel, in one channel or, with channel 3, in all.
Picture Ramp(std::size_t channel, std::size_t first) {
    Picture picture(4 * kPixels, 1.0f);
    for (std::size_t i = 0; i < picture.size(); ++i) {
        if (i % 4 == 3) continue;
        const auto value = static_cast<double>(std::min(i / 4 + first, kPixels - 1)) / 65535.0;
        picture[i] = channel == 3 || i % 4 == channel ? static_cast<float>(value) : i % 4 == 1 ? 0.3f : 0.6f;
    }
    return picture;
}

// The formula and the bounds of every pixel.
std::vector<Colour> ExactOf(const render::StageSettings& settings, const Picture& picture, double seconds) {
    // What the rest starts from: the shaken picture with its diffusion.
    render::StageSettings start;
    start.yJitter = settings.yJitter, start.xJitter = settings.xJitter;
    start.borderColour = settings.borderColour;
    start.glow = settings.glow;
    const Picture pixels = RenderedDeep(start, picture, seconds);
    const double rounding = settings.glow > 0.0f ? kGlowRounding : 0.0;
    Frame frame(seconds);
    const render::FramePlan plan =
        PlanFrame(frame.context, settings, frame.state, render::KernelsOf(render::SimdLevel::kPlain));
    const ExactChain chain(plan);
    std::vector<Colour> result, row(kWidth);
    for (std::int32_t y = 0; y < kHeight; ++y) {
        for (std::size_t x = 0; x < row.size(); ++x) {
            for (std::size_t c = 0; c < 3; ++c) {
                const double level = 255.0 * pixels[4 * (static_cast<std::size_t>(y) * kWidth + x) + c];
                row[x][c] = {std::max(level - rounding, 0.0), level, std::min(level + rounding, 255.0)};
            }
        }
        chain.Run(row, y);
        result.insert(result.end(), row.begin(), row.end());
    }
    return result;
}

// In levels of 255, but the steps.
struct Figures {
    double mean = 0.0;  // of deep less 8 bits
    double worst = 0.0, percentile = 0.0;
    double beyond1 = 0.0, beyond2 = 0.0;  // shares of samples that are more than a level, or two, apart
    double shifted = 0.0;                 // the largest difference after the best shift of all samples
    double steepest = 0.0;  // largest step between neighbouring values of the ramps, in steps of the ramp
    double wrong = 0.0;     // the largest distance from the formula
    int outside = 0;        // 8-bit samples that no rounding explains
};

void Compare(const render::StageSettings& settings, Figures& figures) {
    const Picture picture = Bytes();
    std::vector<double> sizes;
    double sum = 0.0, least = 0.0, most = 0.0;
    for (const double seconds : kTimes) {
        const std::vector<Colour> exact = ExactOf(settings, picture, seconds);
        const Picture deep = RenderedDeep(settings, picture, seconds),
                      bytes = RenderedBytes(settings, picture, seconds);
        for (std::size_t i = 0; i < 3 * kPixels; ++i) {
            const std::size_t at = i / 3 * 4 + i % 3;
            const testing::Level level = exact[i / 3][i % 3];
            const double byte = 255.0 * bytes[at], own = 255.0 * deep[at];
            figures.wrong = std::max(figures.wrong, std::abs(own - level.exact));
            figures.outside += byte < level.low - kPrecision || byte > level.high + kPrecision;
            const double difference = std::clamp(own, 0.0, 255.0) - byte;
            sum += difference;
            least = std::min(least, difference), most = std::max(most, difference);
            sizes.push_back(std::abs(difference));
        }
    }
    const auto count = static_cast<double>(sizes.size());
    const auto share = [&](double limit) {
        return static_cast<double>(
                   std::count_if(sizes.begin(), sizes.end(), [limit](double s) { return s > limit; })) /
               count;
    };
    figures.beyond1 = share(1.0 + kPrecision), figures.beyond2 = share(2.0 + kPrecision);
    const auto place = sizes.begin() + static_cast<std::ptrdiff_t>(0.999 * count);
    std::nth_element(sizes.begin(), place, sizes.end());
    figures.percentile = *place;
    figures.worst = std::max(most, -least), figures.shifted = (most - least) / 2;
    figures.mean = sum / count;
}

// The next value of the ramp is rendered at the same place, where damage is the same.
void Climb(const render::StageSettings& settings, Figures& figures) {
    constexpr double kSeconds = 7.3;
    for (std::size_t channel = 0; channel < 4; ++channel) {
        const Picture from = Ramp(channel, 0);
        const std::vector<Colour> exact = ExactOf(settings, from, kSeconds);
        const Picture low = RenderedDeep(settings, from, kSeconds),
                      high = RenderedDeep(settings, Ramp(channel, 1), kSeconds);
        for (std::size_t i = 0; i < low.size(); ++i) {
            if (i % 4 == 3) continue;
            figures.wrong = std::max(figures.wrong, std::abs(255.0 * low[i] - exact[i / 4][i % 4].exact));
            figures.steepest =
                std::max(figures.steepest, std::abs(double{high[i]} - double{low[i]}) * 65535.0);
        }
    }
}

bool IsGood(const Figures& figures) {
    return figures.outside == 0 && figures.wrong < kPrecision;
}

int Run(bool printsTable) {
    if (printsTable) {
        std::printf(
            "| preset | mean | largest | 99.9 %% | beyond 1 | beyond 2 | shifted | steepest |\n"
            "|---|---|---|---|---|---|---|---|\n");
    }
    int failures = 0;
    for (const EffectTable* effect : kAllEffects) {
        const auto session = EffectSession::Create(*effect);
        for (std::uint32_t preset = 0; preset < effect->presetNames.size(); ++preset) {
            session->ApplyPreset(preset);
            const render::StageSettings settings = session->PresentSettings();
            Figures figures;
            Compare(settings, figures);
            Climb(settings, figures);
            failures += !IsGood(figures);
            if (printsTable)
                std::printf("| %s, %s | %.2f | %.2f | %.2f | %.2f %% | %.2f %% | %.2f | %.2f |\n",
                            effect->name, effect->presetNames[preset], figures.mean, figures.worst,
                            figures.percentile, 100.0 * figures.beyond1, 100.0 * figures.beyond2,
                            figures.shifted, figures.steepest);
            if (!IsGood(figures))
                std::printf(
                    "%s, %s: %d samples of 8 bits that no rounding explains; %g levels from the formula\n",
                    effect->name, effect->presetNames[preset], figures.outside, figures.wrong);
        }
    }
    return failures == 0 ? 0 : 1;
}

}  // namespace
}  // namespace velmora::effects

int main(int argc, char** argv) {
    return velmora::effects::Run(argc > 1 && std::string_view(argv[1]) == "--table");
}

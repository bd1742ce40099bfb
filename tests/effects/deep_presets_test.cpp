// Every built-in preset on deep pixels: beside the 8-bit picture, and on a ramp of all 16-bit greys.
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

namespace velmora::effects {
namespace {

constexpr std::int32_t kWidth = 256, kHeight = 256;
constexpr std::size_t kPixels = std::size_t{kWidth} * kHeight;
constexpr double kTimes[] = {0.0, 1.0, 7.3};

// In levels of 255.
struct Figures {
    double mean = 0.0;      // of deep less 8 bits
    double spread = 0.0;    // standard deviation
    double worst = 0.0;     // absolute
    double beyond = 0.0;    // share of samples that are more than a level apart
    double steepest = 0.0;  // largest step between neighbouring greys of the ramp, in steps of the ramp
};

// Gradients, noise, waves and blocks.
std::vector<std::uint8_t> Picture() {
    std::vector<std::uint8_t> bytes(kPixels * 4);
    std::mt19937 numbers(5);
    for (std::size_t i = 0; i < bytes.size(); ++i) {
        const std::size_t x = i / 4 % kWidth, y = i / 4 / kWidth, channel = i % 4;
        const double wave = 127.5 + 127.5 * std::sin(static_cast<double>(x * (channel + 1)) * 0.05 +
                                                     static_cast<double>(y) * 0.1);
        const std::size_t values[] = {x, numbers() % 256, static_cast<std::size_t>(wave),
                                      (x / 16 * 16 + channel * 30 + y) % 256};
        bytes[i] = static_cast<std::uint8_t>(values[y / 64]);
    }
    return bytes;
}

std::unique_ptr<EffectSession> SessionOf(const EffectTable& effect, std::uint32_t preset) {
    auto session = EffectSession::Create(effect);
    session->ApplyPreset(preset);
    session->PinRandom(0);
    return session;
}

std::vector<float> RenderedDeep(EffectSession& session, std::vector<float> pixels, double seconds) {
    const render::DeepPicture picture = {pixels.data(), kWidth * 16};
    if (!session.RenderDeep(render::DeepFrame::Whole(kWidth, kHeight, {}, picture, picture), seconds))
        std::abort();
    return pixels;
}

void Compare(EffectSession& session, Figures& figures) {
    std::vector<std::uint8_t> bytes = Picture(), result(bytes.size());
    std::vector<float> deep(bytes.size());
    // The deep order is red, green, blue.
    constexpr std::size_t kOrder[] = {2, 1, 0, 3};
    for (std::size_t i = 0; i < bytes.size(); ++i)
        deep[i] = static_cast<float>(bytes[i / 4 * 4 + kOrder[i % 4]]) / 255.0f;
    double sum = 0.0, squares = 0.0, count = 0.0;
    for (const double seconds : kTimes) {
        const FrameRecord source = {bytes.data(), kWidth, kHeight, kWidth * 4, 0, 0, 0};
        const FrameRecord destination = {result.data(), kWidth, kHeight, kWidth * 4, 0, 0, 0};
        if (!session.Render(source, destination, seconds)) std::abort();
        const std::vector<float> rendered = RenderedDeep(session, deep, seconds);
        for (std::size_t i = 0; i < result.size(); ++i) {
            if (i % 4 == 3) continue;
            const double difference =
                255.0 * std::clamp(double{rendered[i]}, 0.0, 1.0) - result[i / 4 * 4 + kOrder[i % 4]];
            sum += difference;
            squares += difference * difference;
            figures.worst = std::max(figures.worst, std::abs(difference));
            figures.beyond += std::abs(difference) > 1.001;
            count += 1.0;
        }
    }
    figures.mean = sum / count;
    figures.spread = std::sqrt(squares / count - figures.mean * figures.mean);
    figures.beyond /= count;
}

// The next grey of the ramp is rendered at the same place, where damage is the same.
void Climb(EffectSession& session, Figures& figures) {
    const auto ramp = [](std::size_t first) {
        std::vector<float> pixels(kPixels * 4, 1.0f);
        for (std::size_t i = 0; i < pixels.size(); ++i) {
            if (i % 4 != 3)
                pixels[i] =
                    static_cast<float>(static_cast<double>(std::min(i / 4 + first, kPixels - 1)) / 65535.0);
        }
        return pixels;
    };
    for (const double seconds : kTimes) {
        const std::vector<float> from = RenderedDeep(session, ramp(0), seconds),
                                 to = RenderedDeep(session, ramp(1), seconds);
        for (std::size_t i = 0; i < from.size(); ++i) {
            figures.steepest =
                std::max(figures.steepest, std::abs(double{to[i]} - double{from[i]}) * 65535.0);
        }
    }
}

// The mean would be off by a level or more if one truncation were forgotten. The steepest formula is a contrast of 3.5,
// two bends of pi / 2 and a tint of 2, after a diffusion whose light grows 8 times as fast as the picture; a step of a
// table would be 257.
bool IsGood(const Figures& figures) {
    return std::abs(figures.mean) < 0.5 && figures.steepest < 3.5 * 2.47 * 2.0 * 8.0;
}

int Run(bool printsTable) {
    if (printsTable)
        std::printf(
            "| preset | mean | deviation | largest | beyond 1 | steepest |\n|---|---|---|---|---|---|\n");
    int failures = 0;
    for (const EffectTable* effect : kAllEffects) {
        for (std::uint32_t preset = 0; preset < effect->presetNames.size(); ++preset) {
            Figures figures;
            const auto session = SessionOf(*effect, preset);
            Compare(*session, figures);
            Climb(*session, figures);
            failures += !IsGood(figures);
            if (!printsTable && IsGood(figures)) continue;
            std::printf("| %s, %s | %.2f | %.2f | %.2f | %.2f %% | %.2f |\n", effect->name,
                        effect->presetNames[preset], figures.mean, figures.spread, figures.worst,
                        100.0 * figures.beyond, figures.steepest);
        }
    }
    return failures == 0 ? 0 : 1;
}

}  // namespace
}  // namespace velmora::effects

int main(int argc, char** argv) {
    return velmora::effects::Run(argc > 1 && std::string_view(argv[1]) == "--table");
}

// Deep pictures: against the formulas in double precision, against the 8-bit picture, and against themselves at other
// SIMD levels, in parts and in place.

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <new>
#include <numbers>
#include <random>
#include <string>
#include <thread>
#include <vector>

#include "render/deep/deep_renderer.h"
#include "tests/render/plain_picture.h"

namespace {
std::atomic<std::size_t> allocations;
}

void* operator new[](std::size_t size, const std::nothrow_t&) noexcept {
    ++allocations;
    return std::malloc(size);
}
void* operator new[](std::size_t size) {
    if (void* memory = operator new[](size, std::nothrow)) return memory;
    throw std::bad_alloc();
}
void operator delete[](void* memory) noexcept {
    std::free(memory);
}
void operator delete[](void* memory, std::size_t) noexcept {
    std::free(memory);
}

namespace velmora::render {
namespace {

constexpr float kNotANumber = std::numeric_limits<float>::quiet_NaN();

struct Deep {
    std::int32_t width, height;
    DeepFormat format;
    std::vector<float> samples;  // of both kinds of samples

    Deep(std::int32_t w, std::int32_t h, DeepFormat f)
        : width(w), height(h), format(f), samples(static_cast<std::size_t>(RowStep() * h / 4)) {}
    [[nodiscard]] std::ptrdiff_t RowStep() const { return (width * format.PixelBytes() + 3) / 4 * 4; }
    [[nodiscard]] DeepPicture Picture() { return {samples.data(), RowStep()}; }
    [[nodiscard]] std::uint16_t* Words() { return reinterpret_cast<std::uint16_t*>(samples.data()); }
    bool operator==(const Deep& other) const {
        return std::memcmp(samples.data(), other.samples.data(), samples.size() * sizeof(float)) == 0;
    }
};

StageSettings Everything() {
    StageSettings settings;
    settings.yJitter = settings.xJitter = 5;
    settings.borderColour = 0x80402010u;
    settings.glow = 0.6f;
    settings.saturation = 0.4f;
    settings.flicker = 0.3f;
    settings.flickerRate = 7;
    settings.brightness = 0.2f;
    settings.contrast = -0.2f;
    settings.filmGamma = 0.7f;
    settings.tintRed = 0.8f;
    settings.tintBlue = 0.3f;
    settings.wear = 0.4f;
    settings.scratchKinds = kScratchBlack | kScratchWhite | kScratchThick;
    settings.scratchCount = 16;
    settings.scratchConstant = 35;
    settings.scratchDepth = 0.8f;
    settings.scratchSeed = 36.0f;
    settings.spots = 100.0f;
    return settings;
}

void Render(const DeepFrame& frame, const StageSettings& settings, SimdLevel level = BestSimdLevel()) {
    RenderState state;
    DeepMemory memory;
    FrameContext context(frame.width, frame.height);
    context.SetTime(1.5);
    state.random.Pin(3, context.FrameNumber());
    state.random.BeginFrame(context.FrameNumber());
    ASSERT_TRUE(frame.IsValid());
    ASSERT_TRUE(
        RenderDeep(frame, context, settings, state, memory, {.level = level, .streamedBytes = 20000}));
}

Deep Rendered(Deep source, const StageSettings& settings, SimdLevel level = BestSimdLevel()) {
    Deep result = source;
    Render(DeepFrame::Whole(source.width, source.height, source.format, source.Picture(), result.Picture()),
           settings, level);
    return result;
}

// Mostly within 0..1; floats are sometimes far outside or no numbers.
Deep Noise(std::int32_t width, std::int32_t height, DeepFormat format) {
    Deep picture(width, height, format);
    std::mt19937 numbers(static_cast<std::uint32_t>(width * 7 + height));
    std::uniform_real_distribution<float> inside(0.0f, 1.0f), outside(-2.0f, 3.0f);
    for (float& sample : picture.samples) {
        const auto kind = numbers() % 64;
        sample = kind == 0 ? kNotANumber : kind == 1 ? outside(numbers) : inside(numbers);
        const auto word = static_cast<std::uint32_t>(numbers());
        if (format.samples == DeepSamples::kUnsigned16) std::memcpy(&sample, &word, sizeof word);
    }
    return picture;
}

constexpr DeepFormat kFormats[] = {{DeepSamples::kFloat, 4, false},     {DeepSamples::kFloat, 4, true},
                                   {DeepSamples::kFloat, 3, false},     {DeepSamples::kUnsigned16, 4, false},
                                   {DeepSamples::kUnsigned16, 4, true}, {DeepSamples::kUnsigned16, 3, false}};

TEST(DeepLevels, GiveTheSameBytes) {
    for (const DeepFormat& format : kFormats) {
        for (const auto& [width, height] : {std::pair{1, 1}, {7, 5}, {50, 310}, {515, 20}, {600, 1210}}) {
            const Deep source = Noise(width, height, format);
            const Deep plain = Rendered(source, Everything(), SimdLevel::kPlain);
            for (const SimdLevel level : kSimdLevels) {
                if (level > BestSimdLevel()) break;
                EXPECT_TRUE(Rendered(source, Everything(), level) == plain)
                    << width << 'x' << height << " level " << static_cast<int>(level);
            }
        }
    }
}

// Any number of workers, each with memory of its own, gives the same frames.
TEST(DeepFrame, CanBeRenderedByManyThreads) {
    const Deep source = Noise(333, 210, {});
    const Deep alone = Rendered(source, Everything());
    std::vector<Deep> results(6, source);
    std::vector<std::thread> workers;
    workers.reserve(results.size());
    for (Deep& result : results)
        workers.emplace_back([&source, &result] { result = Rendered(source, Everything()); });
    for (std::thread& worker : workers) worker.join();
    for (const Deep& result : results) EXPECT_TRUE(result == alone);
}

TEST(DeepFrame, AllocatesOnlyForTheFirst) {
    Deep source = Noise(400, 700, {}), result = source;
    RenderState state;
    DeepMemory memory;
    FrameContext context(400, 700);
    std::size_t before = 0;
    for (int frame = 0; frame < 40; ++frame) {
        context.SetTime(frame / 30.0);
        state.random.BeginFrame(context.FrameNumber());
        ASSERT_TRUE(RenderDeep(DeepFrame::Whole(400, 700, {}, result.Picture(), result.Picture()), context,
                               Everything(), state, memory));
        if (frame == 0) before = allocations;
    }
    EXPECT_GT(before, 0u);
    EXPECT_EQ(allocations, before);
}

// Tiles, bottom-up rows and work in place give the bytes of the whole frame.
TEST(DeepFrame, CanBeRenderedInParts) {
    for (const DeepFormat& format : kFormats) {
        Deep source = Noise(700, 90, format);
        const Deep whole = Rendered(source, Everything());
        Deep parts = Noise(700, 90, format);
        for (const Rectangle& window :
             {Rectangle{0, 40, 0, 333}, {0, 40, 333, 700}, {40, 90, 0, 1}, {40, 90, 1, 700}}) {
            Render({700, 90, format, source.Picture(), parts.Picture(), window}, Everything());
        }
        EXPECT_TRUE(parts == whole);
        Deep inPlace = source;
        Render(DeepFrame::Whole(700, 90, format, inPlace.Picture(), inPlace.Picture()), Everything());
        EXPECT_TRUE(inPlace == whole);

        Deep turned = source;
        for (std::int32_t y = 0; y < 90; ++y) {
            std::memcpy(turned.Picture().Row(y), source.Picture().Row(89 - y),
                        static_cast<std::size_t>(source.RowStep()));
        }
        const DeepPicture bottomUp = {turned.Picture().Row(89), -turned.RowStep()};
        Deep fromTurned = source;
        Render(DeepFrame::Whole(700, 90, format, bottomUp, fromTurned.Picture()), Everything());
        EXPECT_TRUE(fromTurned == whole);
    }
}

TEST(DeepFrame, RefusesWhatItCannotRender) {
    Deep picture(8, 8, {});
    const DeepFrame good = DeepFrame::Whole(8, 8, {}, picture.Picture(), picture.Picture());
    EXPECT_TRUE(good.IsValid());
    const auto refuses = [&good](auto&& change) {
        DeepFrame frame = good;
        change(frame);
        return !frame.IsValid();
    };
    EXPECT_TRUE(refuses([](DeepFrame& f) { f.width = 0; }));
    EXPECT_TRUE(refuses([](DeepFrame& f) { f.format.channels = 2; }));
    EXPECT_TRUE(refuses([](DeepFrame& f) { f.source.pixels = nullptr; }));
    EXPECT_TRUE(refuses([](DeepFrame& f) { f.destination.rowStep = 8 * 16 - 4; }));
    EXPECT_TRUE(refuses([](DeepFrame& f) { f.source.rowStep += 2; }));
    EXPECT_TRUE(refuses([](DeepFrame& f) { f.window.right = 9; }));
    EXPECT_TRUE(refuses([](DeepFrame& f) { f.window.bottom = 0; }));
}

// The stages of the look on one grey, restated with sines and whole numbers; levels of 255.
double LookOf(double level, const ColourStage& colour, std::int32_t offset, double gamma) {
    const double v = colour.Offset();
    level += v > 0 ? (255 - level) * v : level * v;
    if (const auto gain = colour.Gain()) {
        level = ((level / 255 - 0.5) * *gain + 0.5) * 255 - 0.5;
        if (*gain > 1) level = std::clamp(level, 0.0, 255.0);
    }
    if (const double w = colour.Weight(); colour.Mixes()) {
        level =
            std::clamp(((127 - w) * level + w * 255 / 256 * level) / 128 - 0.5 * (1 + w / 128), 0.0, 255.0);
    }
    const auto bend = [gamma](double x) {
        const double curve = (1 - std::cos(std::numbers::pi * x / 256)) / 2 * 256;
        return gamma == 0 ? x : std::max(curve * gamma + x * (1 - gamma) - 0.5, 0.0);
    };
    level = bend(level);
    level = offset > 0 ? std::min(offset + level * (256 - offset) / 255, 255.0)
                       : std::max((level + offset) * 255 / (256 + offset), 0.0);
    return std::min(bend(level), 255.0);
}

StageSettings RandomLook(std::mt19937& numbers) {
    const auto draw = [&numbers](float from, float to) {
        const float value = std::uniform_real_distribution<float>(from, to)(numbers);
        return numbers() % 4 == 0 ? 0.0f : value;
    };
    StageSettings settings;
    settings.saturation = draw(-1.0f, 1.0f);
    settings.flicker = draw(0.0f, 1.0f);
    settings.flickerRate = 9;
    settings.brightness = draw(-1.0f, 1.0f);
    settings.contrast = draw(-1.0f, 1.0f);
    settings.filmGamma = draw(0.0f, 1.0f);
    settings.tintRed = 0.5f + draw(-0.5f, 0.5f);
    return settings;
}

// A ramp of all 16-bit greys through random looks: every value is the formula's, and no step is larger than the slopes
// of the stages allow.
TEST(DeepLook, IsTheFormulaWithoutSteps) {
    std::mt19937 numbers(11);
    Deep ramp(65536, 1, {DeepSamples::kFloat, 3, false});
    for (std::size_t i = 0; i < ramp.samples.size(); ++i)
        ramp.samples[i] = static_cast<float>(static_cast<double>(i / 3) / 65535.0);
    for (int round = 0; round < 60; ++round) {
        const StageSettings settings = RandomLook(numbers);
        ContrastCache cache;
        const ColourStage colour = PrepareColour(settings, 1.5, cache);
        const TintStage tint = PrepareTint(settings);
        const std::int32_t offset = TintOffset(settings.tintRed);
        const Deep result = Rendered(ramp, settings);
        double worst = 0.0, largest = 0.0;
        for (std::size_t i = 0; i < 65536; ++i) {
            const double level = static_cast<double>(i) / 257.0;
            const double wanted = !colour.IsActive() && !tint.IsActive() ? level
                                  : !tint.IsActive() ? LookOf(level, colour, 0, 0) * 256 / 255
                                                     : LookOf(level, colour, offset, settings.filmGamma);
            worst = std::max(worst, std::abs(wanted / 255.0 - double{result.samples[3 * i]}));
            if (i > 0)
                largest = std::max(
                    largest, std::abs(double{result.samples[3 * i]} - double{result.samples[3 * i - 3]}));
        }
        const double bend = 1.0 + settings.filmGamma * (std::numbers::pi / 2 - 1.0);
        const double slope =
            colour.Gain().value_or(1.0) * bend * bend * (offset < 0 ? 255.0 / (256 + offset) : 1.0);
        EXPECT_LT(worst, 3e-6) << round;
        EXPECT_LT(largest, slope / 65535.0 + 1e-6) << round;
    }
}

// Half a level that 8 bits truncate is more than a slight contrast adds to black.
TEST(DeepLook, KeepsBlackAtLeast0) {
    for (const float contrast : {-0.0005f, -0.002f, -0.004f, -0.01f}) {
        StageSettings settings;
        settings.contrast = contrast;
        Deep greys(3, 1, {DeepSamples::kFloat, 3, false});
        for (std::size_t i = 0; i < greys.samples.size(); ++i)
            greys.samples[i] = static_cast<float>(i / 3) / 2.0f;
        const std::vector<float> result = Rendered(greys, settings).samples;
        EXPECT_GE(result[0], 0.0f) << contrast;
        EXPECT_LE(result[0], 0.01f) << contrast;
        EXPECT_NEAR(result[3], 0.5f, 0.51f / 255.0f) << contrast;
        EXPECT_NEAR(result[0] + result[6], 1.0f, 1.01f / 255.0f) << contrast;
    }
}

// Diffusion starts from the picture, so there is no formula of a single pixel. But if a picture's greys rise by a 65535th,
// no pixel rises by much more than a sixteenth of what it, or one near it, rises by in sixteen such steps.
TEST(DeepLook, DiffusesWithoutSteps) {
    constexpr std::int32_t kSide = 256, kNear = 128;
    StageSettings settings;
    for (const float amount : {0.2f, 1.0f}) {
        settings.glow = amount;
        const auto risen = [&settings](std::int32_t by) {
            Deep ramp(kSide, kSide, {DeepSamples::kFloat, 3, false});
            for (std::int32_t i = 0; i < kSide * kSide * 3; ++i)
                ramp.samples[static_cast<std::size_t>(i)] =
                    static_cast<float>(std::min(i / 3 + by, 65535) / 65535.0);
            return Rendered(ramp, settings).samples;
        };
        const std::vector<float> low = risen(0), next = risen(1), high = risen(16);
        for (std::size_t i = 0; i < low.size(); i += 3) {
            const std::size_t from = i < 3 * kNear ? 0 : i - 3 * kNear,
                              to = std::min(low.size(), i + 3 * kNear);
            float most = 0.0f;
            for (std::size_t j = from; j < to; j += 3) most = std::max(most, high[j] - low[j]);
            ASSERT_LE(next[i] - low[i], 1.2f * most / 16.0f + 5e-7f) << i / 3;
        }
    }
}

struct StageCase {
    const char* name;
    double most;  // difference of levels of 255: what the 8-bit stage rounds
    void (*set)(StageSettings& settings, float amount);
};
constexpr StageCase kStages[] = {
    {"jitter", 0.001,
     [](StageSettings& s, float a) { s.xJitter = s.yJitter = static_cast<std::int32_t>(10 * a); }},
    {"glow", 1.15, [](StageSettings& s, float a) { s.glow = a; }},
    {"brightness", 0.501, [](StageSettings& s, float a) { s.brightness = 2 * a - 1; }},
    {"flicker", 0.501, [](StageSettings& s, float a) { s.flicker = a; }},
    {"contrast", 0.501, [](StageSettings& s, float a) { s.contrast = 2 * a - 1; }},
    {"saturation", 1.001, [](StageSettings& s, float a) { s.saturation = 2 * a - 1; }},
    {"tint", 0.51, [](StageSettings& s, float a) { s.tintRed = a, s.tintBlue = 1 - a; }},
    {"wear", 0.501, [](StageSettings& s, float a) { s.wear = a; }},
    {"spots", 1.6, [](StageSettings& s, float a) { s.spots = 100 * a; }},
    {"scratches", 1.6,
     [](StageSettings& s, float a) {
         s.scratchKinds = kScratchBlack | kScratchWhite | kScratchThick;
         s.scratchCount = 16, s.scratchConstant = 35, s.scratchDepth = a, s.scratchSeed = 35 + a;
     }},
};

// Spots and scratches round once for each that covers a pixel, of which there are at most three here.
TEST(DeepStage, DiffersFromTheByteStageByItsRounding) {
    constexpr std::int32_t kWidth = 300, kHeight = 200;
    testing::PlainPicture bytes = testing::PlainPicture::Random(kWidth, kHeight, 5);
    Deep source(kWidth, kHeight, {});
    for (std::size_t i = 0; i < bytes.Pixels().size(); ++i) {
        const Bgra p = bytes.Pixels()[i];
        const float four[] = {static_cast<float>(p.red), static_cast<float>(p.green),
                              static_cast<float>(p.blue), static_cast<float>(p.alpha)};
        for (std::size_t c = 0; c < 4; ++c) source.samples[4 * i + c] = four[c] / 255.0f;
    }
    for (const StageCase& stage : kStages) {
        for (const float amount : {0.1f, 0.3f, 0.5f, 0.8f, 1.0f}) {
            StageSettings settings;
            stage.set(settings, amount);
            const Deep deep = Rendered(source, settings);
            testing::PlainPicture result(kWidth, kHeight);
            FrameContext context(bytes.Description(), result.Description());
            context.SetTime(1.5);
            RenderState state;
            state.random.Pin(3, context.FrameNumber());
            state.random.BeginFrame(context.FrameNumber());
            RenderStages(context, settings, state);
            context.Finish();
            double worst = 0.0;
            for (std::size_t i = 0; i < result.Pixels().size(); ++i) {
                const Bgra p = result.Pixels()[i];
                const std::uint8_t four[] = {p.red, p.green, p.blue, p.alpha};
                for (std::size_t c = 0; c < 4; ++c) {
                    worst = std::max(
                        worst, std::abs(four[c] - 255.0 * std::clamp(deep.samples[4 * i + c], 0.0f, 1.0f)));
                }
            }
            EXPECT_LT(worst, stage.most) << stage.name << ' ' << amount;
        }
    }
}

// One row of greys, the last channel alpha.
std::vector<float> Greys(const std::vector<float>& greys, const StageSettings& settings, float alpha = 1.0f) {
    Deep source(static_cast<std::int32_t>(greys.size()), 1, {});
    for (std::size_t i = 0; i < source.samples.size(); ++i)
        source.samples[i] = i % 4 == 3 ? alpha : greys[i / 4];
    const Deep result = Rendered(source, settings);
    std::vector<float> red;
    for (std::size_t i = 0; i < greys.size(); ++i) red.push_back(result.samples[4 * i]);
    return red;
}

TEST(DeepLook, ContinuesInLinesOutside) {
    StageSettings settings;
    settings.brightness = 0.3f;
    settings.contrast = -0.4f;
    settings.saturation = -0.5f;
    settings.filmGamma = 0.6f;
    settings.tintRed = 0.7f;
    const std::vector<float> y = Greys({-2.0f, -1.5f, -1.0f, 2.0f, 2.5f, 3.0f, 0.999f, 1.0f}, settings);
    EXPECT_NEAR(y[1] - y[0], y[2] - y[1], 1e-5);
    EXPECT_NEAR(y[4] - y[3], y[5] - y[4], 1e-5);
    EXPECT_GT(y[3], y[7]);
    EXPECT_GT(y[1], y[0]);
    StageSettings clamped;
    clamped.contrast = 0.8f;
    EXPECT_EQ(Greys({-1.0f, 0.0f, 1.0f, 4.0f}, clamped), (std::vector<float>{0.0f, 0.0f, 1.0f, 1.0f}));
}

// A colour whose red goes beyond white through a saturation, and flat light through a full glow layer.
TEST(DeepLook, ContinuesInLinesAboveWhite) {
    StageSettings saturated;
    for (const float saturation : {-0.7f, 0.8f}) {
        saturated.saturation = saturation;
        Deep colours(6, 1, {DeepSamples::kFloat, 3, false});
        const float reds[] = {0.99999f, 1.0f, 1.00001f, 2.0f, 3.0f, 4.0f};
        for (std::size_t i = 0; i < 18; ++i) colours.samples[i] = i % 3 == 0 ? reds[i / 3] : 0.4f;
        const std::vector<float> y = Rendered(colours, saturated).samples;
        for (std::size_t c = 0; c < 3; ++c) {
            EXPECT_NEAR(y[3 * 5 + c] - y[3 * 4 + c], y[3 * 4 + c] - y[3 * 3 + c], 1e-6) << c;
            EXPECT_NEAR(y[c], y[3 * 2 + c], 1e-4) << c;
        }
        EXPECT_GT(y[3 * 4], y[3 * 3]);
    }
    StageSettings misty;
    misty.glow = 1.0f;
    const auto flat = [&misty](float grey) { return Greys(std::vector<float>(9, grey), misty)[4]; };
    EXPECT_EQ(flat(1.0f), 1.0f);
    EXPECT_NEAR(flat(3.0f) - flat(2.0f), flat(2.0f) - flat(1.0f), 1e-6);
    EXPECT_GT(flat(2.0f), 1.2f);
    EXPECT_LT(flat(-1.0f), 0.0f);
}

// Whether a block has a pixel outside 0..1 makes no difference to the pixels inside.
TEST(DeepLook, DoesNotDependOnTheNeighbours) {
    std::mt19937 numbers(4);
    for (int round = 0; round < 40; ++round) {
        StageSettings settings = RandomLook(numbers);
        settings.tintBlue = 0.7f;
        std::vector<float> greys(300);
        for (float& grey : greys) grey = static_cast<float>(numbers() % 1001) / 1000.0f;
        std::vector<float> outside = greys;
        outside[7] = 1.5f;
        outside[8] = kNotANumber;
        const std::vector<float> a = Greys(greys, settings), b = Greys(outside, settings);
        for (std::size_t i = 9; i < a.size(); ++i) ASSERT_EQ(a[i], b[i]) << round << ' ' << i;
    }
}

TEST(DeepDamage, StopsAtWhiteAndKeepsAlpha) {
    StageSettings settings;
    settings.wear = 1.0f;
    for (const float y : Greys(std::vector<float>(60, 1.7f), settings)) EXPECT_EQ(y, 1.7f);
    for (const float y : Greys(std::vector<float>(60, 0.4f), settings)) EXPECT_TRUE(y >= 0.4f && y <= 1.0f);
    StageSettings all = Everything();
    all.xJitter = all.yJitter = 0;
    Deep source = Noise(64, 64, {});
    const Deep result = Rendered(source, all);
    for (std::size_t i = 3; i < source.samples.size(); i += 4) {
        const float alpha = source.samples[i];
        EXPECT_EQ(result.samples[i], alpha == alpha ? alpha : 0.0f);
    }
}

TEST(DeepPicture, CountsWhatIsNoNumberAsBlack) {
    EXPECT_EQ(Greys({kNotANumber, 0.5f}, Everything()), Greys({0.0f, 0.5f}, Everything()));
    EXPECT_EQ(Greys({kNotANumber}, StageSettings{}), std::vector<float>{0.0f});
    for (const float y : Greys(
             {std::numeric_limits<float>::infinity(), -std::numeric_limits<float>::infinity()}, Everything()))
        EXPECT_TRUE(std::isfinite(y));
}

TEST(DeepPicture, DividesAndMultipliesPremultipliedColours) {
    StageSettings settings = Everything();
    settings.xJitter = settings.yJitter = 0;
    Deep straight(90, 40, {});
    Deep multiplied(90, 40, {DeepSamples::kFloat, 4, true});
    std::mt19937 numbers(2);
    for (float& sample : straight.samples) sample = static_cast<float>(numbers() % 256) / 256.0f;
    for (std::size_t i = 0; i < straight.samples.size(); ++i) {
        multiplied.samples[i] = straight.samples[i] * (i % 4 == 3 ? 1.0f : straight.samples[i | 3]);
        if (straight.samples[i | 3] == 0.0f && i % 4 != 3) straight.samples[i] = 0.0f;
    }
    const Deep a = Rendered(straight, settings), b = Rendered(multiplied, settings);
    for (std::size_t i = 0; i < a.samples.size(); ++i) {
        const float alpha = i % 4 == 3 ? 1.0f : a.samples[i | 3];
        ASSERT_NEAR(a.samples[i] * alpha, b.samples[i], 1e-5) << i;
    }
}

}  // namespace
}  // namespace velmora::render

// Rendering through the effects: sessions compared with each other and with the effect objects.

#include "effects/effect_session.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <memory>
#include <set>
#include <string>
#include <string_view>
#include <thread>
#include <utility>
#include <vector>

#include "effects/film_effect.h"
#include "effects/process_state.h"
#include "tests/effects/test_hosts.h"

namespace velmora::tests {
namespace {

using namespace effects;

constexpr std::int32_t kWidth = 61;
constexpr std::int32_t kHeight = 44;

// A picture with all kinds of bytes, including alpha.
struct Picture {
    explicit Picture(std::uint32_t seed = 0) : bytes(std::size_t{kWidth} * kHeight * 4) {
        for (std::uint8_t& byte : bytes)
            byte = static_cast<std::uint8_t>((seed = seed * 1664525u + 1013904223u) >> 24);
    }
    FrameRecord Record() { return {bytes.data(), kWidth, kHeight, kWidth * 4, 0, 0, 0}; }
    bool operator==(const Picture&) const = default;

    std::vector<std::uint8_t> bytes;
};

std::unique_ptr<EffectSession> SessionWith(const EffectTable& effect, std::uint32_t preset) {
    auto session = EffectSession::Create(effect);
    session->ApplyPreset(preset);
    return session;
}

Picture FrameOf(EffectSession& session, double seconds) {
    Picture source(7), result;
    EXPECT_TRUE(session.Render(source.Record(), result.Record(), seconds));
    return result;
}

// The middle of frame n's duration.
double SecondsOf(int frame) {
    return (frame + 0.5) / 30.0;
}

std::uint32_t ParamNamed(const EffectTable& effect, std::string_view name) {
    std::uint32_t param = 0;
    while (effect.params[param].name != name) ++param;
    return param;
}

std::uint32_t PresetNamed(const EffectTable& effect, std::string_view name) {
    std::uint32_t preset = 0;
    while (effect.presetNames[preset] != name) ++preset;
    return preset;
}

std::uint32_t Neutral(const EffectTable& effect) {
    return PresetNamed(effect, "Reset To None");
}

// The library's own state, as set up by its entry point.
class ProcessWide : public testing::Test {
  protected:
    void SetUp() override {
        SetBuildMode(kBuildModeReady);
        ASSERT_TRUE(RenewMasterSettings());
        CurrentMasterSettings()->ExposeAll();
    }
    static void StartRandom(std::uint32_t state) { ProcessSession().state->random.Seed(state); }
    static Picture RenderedBy(IVideoEffect& effect, std::uint32_t preset, double seconds) {
        PresetHost host(effect, preset);
        return RenderedFor(effect, host, seconds);
    }
    static Picture RenderedFor(IVideoEffect& effect, IVideoHost& host, double seconds) {
        Picture source(7), result;
        const FrameRecord from = source.Record(), to = result.Record();
        const TimingRecord timing = {0.0, 0.0, seconds};
        EXPECT_TRUE(effect.Process(&host, &from, nullptr, &to, &timing));
        return result;
    }
};

// "Film Damage": Wear 0, Pattern Blotchy, Black on.
TEST(EffectSession, StartsWithTheDefaults) {
    auto session = EffectSession::Create(kFilmDamage);
    EXPECT_EQ(session->Value(7).flag, 1);
    EXPECT_EQ(session->Value(0).number, 0.0f);
    EXPECT_EQ(session->Value(1).item, 1);
    EXPECT_EQ(FrameOf(*session, 1.0), Picture(7));
}

TEST(EffectSession, ValuesAndPresetsPastTheEndChangeNothing) {
    auto session = EffectSession::Create(kFilmCamera);
    session->SetValue(5, {.number = 1.0f});
    session->SetValue(0xFFFFFFFFu, {.number = 1.0f});
    session->ApplyPreset(8);
    EXPECT_EQ(session->Value(5).bits, 0u);
    EXPECT_EQ(FrameOf(*session, 1.0), Picture(7));
}

TEST(EffectSession, PinnedFramesDoNotDependOnTheirOrder) {
    for (const EffectTable* effect : kAllEffects) {
        const std::uint32_t presets = static_cast<std::uint32_t>(effect->presetNames.size());
        for (std::uint32_t preset = 0; preset < presets; ++preset) {
            SCOPED_TRACE(effect->presetNames[preset]);
            auto forward = SessionWith(*effect, preset);
            auto backward = SessionWith(*effect, preset);
            forward->PinRandom(preset);
            backward->PinRandom(preset);
            std::vector<Picture> frames;
            frames.reserve(4);
            for (int frame = 0; frame < 4; ++frame) frames.push_back(FrameOf(*forward, SecondsOf(frame)));
            for (int frame = 3; frame >= 0; --frame) {
                EXPECT_EQ(FrameOf(*backward, SecondsOf(frame)), frames[static_cast<std::size_t>(frame)]);
            }
        }
    }
}

// Scratches alone and flicker alone, which the library draws the same on every run.
std::unique_ptr<EffectSession> ScratchesAlone() {
    auto session = SessionWith(kFilmDamage, Neutral(kFilmDamage));
    session->SetValue(5, {.number = 1.0f});  // Density
    session->SetValue(6, {.number = 1.0f});  // Depth
    session->SetValue(7, {.flag = 1});       // Black
    return session;
}
std::unique_ptr<EffectSession> FlickerAlone() {
    return SessionWith(kFilmCamera, PresetNamed(kFilmCamera, "Fire Light"));
}

TEST(EffectSession, SeedsMoveScratchesAndFlickerButSeed0) {
    constexpr int kFrames[] = {0, 40, 3, 100000};
    const auto framesOf = [&](EffectSession& session) {
        std::vector<Picture> frames;
        for (const int frame : kFrames) frames.push_back(FrameOf(session, SecondsOf(frame)));
        return frames;
    };
    for (auto* const make : {&ScratchesAlone, &FlickerAlone}) {
        SCOPED_TRACE(make()->Effect().name);
        auto session = make();
        session->StartRandom(99);  // as in the library
        const std::vector<Picture> library = framesOf(*session);
        std::vector<std::vector<Picture>> seen = {library};
        for (const std::uint32_t seed : {1u, 2u, 0xFFFFFFFFu}) {
            session->PinRandom(seed);
            seen.push_back(framesOf(*session));
            for (std::size_t i = 0; i + 1 < seen.size(); ++i) EXPECT_NE(seen[i], seen.back()) << seed;
            auto late = make();
            late->PinRandom(seed);
            EXPECT_EQ(FrameOf(*late, SecondsOf(kFrames[2])), seen.back()[2]) << seed;
        }
        session->PinRandom(0);
        EXPECT_EQ(framesOf(*session), library);
    }
}

TEST(EffectSession, TwoThreadsDoNotDisturbEachOther) {
    const auto work = [](const EffectTable& effect, std::uint32_t preset, std::vector<Picture>& frames) {
        auto session = SessionWith(effect, preset);
        for (int frame = 0; frame < 40; ++frame) frames.push_back(FrameOf(*session, SecondsOf(frame)));
    };
    const std::uint32_t super8 = PresetNamed(kFilmPro, "Super 8");
    const std::uint32_t newsreel = PresetNamed(kFilmExpress, "Newsreel");
    std::vector<Picture> alone[2], together[2];
    work(kFilmPro, super8, alone[0]);
    work(kFilmExpress, newsreel, alone[1]);
    std::thread other([&] { work(kFilmPro, super8, together[0]); });
    work(kFilmExpress, newsreel, together[1]);
    other.join();
    EXPECT_EQ(together[0], alone[0]);
    EXPECT_EQ(together[1], alone[1]);
}

// Any frame k of a running sequence can be rendered alone: its state is the initial one advanced by the draws of the
// frames before it.
TEST(EffectSession, ASequenceCanBeEnteredAnywhere) {
    constexpr std::uint32_t kStart = 0x1234ABCDu;
    for (const EffectTable* effect : {&kFilmCamera, &kFilmDamage, &kFilmPro, &kFilmExpress}) {
        for (std::uint32_t preset = 0; preset < effect->presetNames.size(); ++preset) {
            SCOPED_TRACE(effect->presetNames[preset]);
            auto running = SessionWith(*effect, preset);
            auto entering = SessionWith(*effect, preset);
            running->StartRandom(kStart);
            for (int frame = 0; frame < 5; ++frame) {
                const Picture expected = FrameOf(*running, SecondsOf(frame));
                render::Random random(kStart);
                random.Skip(static_cast<std::uint32_t>(frame) * entering->DrawsPerFrame(kWidth));
                entering->StartRandom(random.State());
                EXPECT_EQ(FrameOf(*entering, SecondsOf(frame)), expected) << "frame " << frame;
            }
        }
    }
}

TEST_F(ProcessWide, EffectObjectsAndSessionsRenderTheSameBytes) {
    for (std::uint32_t index = 0; index < kAllEffects.size(); ++index) {
        IVideoEffect* effect = CreateEffectByIndex(index);
        for (std::uint32_t preset = 0; effect->GetPresetName(preset) != nullptr; ++preset) {
            SCOPED_TRACE(std::string(effect->GetName()) + ", " + effect->GetPresetName(preset));
            auto session = SessionWith(*kAllEffects[index], preset);
            StartRandom(preset + 99);
            session->StartRandom(preset + 99);
            // In order, a repeat, and a jump back.
            for (const int frame : {0, 1, 2, 2, 1, 90}) {
                const double seconds = SecondsOf(frame);
                ASSERT_EQ(RenderedBy(*effect, preset, seconds), FrameOf(*session, seconds));
            }
        }
        effect->Release();
    }
}

// Renders a frame of its own before it answers anything.
class NestingHost final : public TestHost {
  public:
    NestingHost(PresetHost& answers, std::function<void()> before)
        : m_answers(answers), m_before(std::move(before)) {}
    bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) override {
        if (m_before) std::exchange(m_before, nullptr)();
        return m_answers.GetParamValue(index, cell, kind);
    }

  private:
    PresetHost& m_answers;
    std::function<void()> m_before;
};

// All of a frame's draws come after its last answer, so the nested frame draws first from the same sequence.
TEST_F(ProcessWide, AFrameInsideAnothersAnswersIsRenderedAsIfBeforeIt) {
    IVideoEffect* const outer = CreateEffectByIndex(4);
    IVideoEffect* const nested = CreateEffectByIndex(4);
    const std::uint32_t preset = PresetNamed(kFilmPro, "Very Old Footage");
    StartRandom(5);
    const Picture first = RenderedBy(*nested, preset, SecondsOf(8));
    const Picture second = RenderedBy(*outer, preset, SecondsOf(3));

    StartRandom(5);
    Picture firstAgain;
    PresetHost answers(*outer, preset);
    NestingHost host(answers, [&] { firstAgain = RenderedBy(*nested, preset, SecondsOf(8)); });
    EXPECT_EQ(RenderedFor(*outer, host, SecondsOf(3)), second);
    EXPECT_EQ(firstAgain, first);
    outer->Release();
    nested->Release();
}

// The columns of a grey picture that scratches touch, and how bright the picture is.
struct Seen {
    std::set<std::int32_t> columns;
    double brightness = 0.0;
};

Seen SeenIn(EffectSession& session, int frame) {
    Picture source, result;
    std::ranges::fill(source.bytes, std::uint8_t{128});
    EXPECT_TRUE(session.Render(source.Record(), result.Record(), SecondsOf(frame)));
    Seen seen;
    for (std::size_t i = 0; i < result.bytes.size(); i += 4) {
        if (result.bytes[i] != result.bytes[kWidth * 4 - 4])
            seen.columns.insert(static_cast<std::int32_t>(i / 4 % kWidth));
        seen.brightness += result.bytes[i];
    }
    return seen;
}

// The same of a deep picture; scratches alone.
std::set<std::int32_t> DeepColumnsIn(EffectSession& session, int frame) {
    constexpr std::ptrdiff_t kStep = kWidth * 4 * sizeof(float);
    std::vector<float> source(static_cast<std::size_t>(kWidth) * kHeight * 4, 0.5f), result(source.size());
    const render::DeepFormat format = {render::DeepSamples::kFloat, 4};
    EXPECT_TRUE(session.RenderDeep(
        render::DeepFrame::Whole(kWidth, kHeight, format, {source.data(), kStep}, {result.data(), kStep}),
        SecondsOf(frame)));
    std::set<std::int32_t> columns;
    for (std::size_t i = 0; i < result.size(); i += 4) {
        if (result[i] != 0.5f) columns.insert(static_cast<std::int32_t>(i / 4 % kWidth));
    }
    return columns;
}

// A fade that rearranged everything in every frame would not look like one.
TEST(EffectSession, ValuesMayChangeInAKeptArrangement) {
    auto constant = EffectSession::Create(kFilmDamage), fading = EffectSession::Create(kFilmDamage);
    const auto density = ParamNamed(kFilmDamage, "Density"), depth = ParamNamed(kFilmDamage, "Depth");
    for (EffectSession* session : {constant.get(), fading.get()}) {
        session->SetValue(density, {.number = 0.75f});
        session->SetValue(depth, {.number = 1.0f});
    }
    fading->KeepArrangement();
    for (int frame = 0; frame < 90; frame += 10) {
        const auto all = SeenIn(*constant, frame).columns;
        const auto allDeep = DeepColumnsIn(*constant, frame);
        fading->SetValue(depth, {.number = 0.9f});
        const auto same = SeenIn(*fading, frame).columns;  // but for edges that are now too faint
        EXPECT_TRUE(same.size() * 4 > all.size() * 3 && std::ranges::includes(all, same)) << frame;
        fading->SetValue(density, {.number = 0.25f});
        const auto some = SeenIn(*fading, frame).columns;
        EXPECT_TRUE(some.size() < all.size() && std::ranges::includes(all, some)) << frame;
        const auto someDeep = DeepColumnsIn(*fading, frame);
        EXPECT_TRUE(someDeep.size() < allDeep.size() && std::ranges::includes(allDeep, someDeep)) << frame;
        fading->SetValue(density, {.number = 0.75f});
    }
    auto whole = EffectSession::Create(kFilmCamera), half = EffectSession::Create(kFilmCamera);
    const auto flicker = ParamNamed(kFilmCamera, "Flicker"), rate = ParamNamed(kFilmCamera, "Flicker Rate");
    for (EffectSession* session : {whole.get(), half.get()}) {
        session->SetValue(flicker, {.number = 0.8f});
        session->SetValue(rate, {.number = 1.0f});
    }
    half->KeepArrangement();
    half->SetValue(flicker, {.number = 0.4f});
    constexpr double kGrey = 128.0 * kWidth * kHeight, kRounding = 2.0 * kWidth * kHeight;
    for (int frame = 0; frame < 30; ++frame) {
        const double wanted = (SeenIn(*whole, frame).brightness - kGrey) / 2.0;
        EXPECT_NEAR(SeenIn(*half, frame).brightness - kGrey, wanted, kRounding) << frame;
    }
}

}  // namespace
}  // namespace velmora::tests

// Frames through the boundary: effects and conversions with any geometry, values and times, several in a row on the
// state that the library keeps. Refused, or worked on so that nothing else is touched and every road and form of the
// kernels gives the same bytes.

#include <algorithm>
#include <array>
#include <cmath>
#include <limits>
#include <memory>
#include <optional>

#include "api/host_api.h"
#include "api/reference.h"
#include "effects/process_state.h"
#include "effects/render_session.h"
#include "render/ycbcr.h"
#include "tests/common/library_under_test.h"
#include "tests/fuzz/fuzz_input.h"
#include "tests/fuzz/fuzzed_frames.h"

namespace velmora::fuzz {
namespace {

// Answers with the words that it was given, or not at all.
class WordHost final : public PlainHost {
  public:
    std::array<std::optional<std::uint32_t>, 40> words;

    bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) override {
        if (index >= words.size() || !words[index]) return false;
        cell->value.bits = *words[index];
        cell->kind = kind;
        return true;
    }
};

void ReadWords(FuzzInput& input, IVideoEffect& effect, WordHost& host) {
    host.words = {};
    const std::uint32_t preset = input.Byte();
    PresetCell cell;
    for (std::uint32_t i = 0; effect.GetPresetValue(preset % 32, i, &cell); ++i)
        host.words[i] = cell.value.bits;
    for (std::int32_t left = input.Below(40); left > 0; --left) {
        std::optional<std::uint32_t>& word = host.words[static_cast<std::size_t>(input.Below(40))];
        // Sliders and menus are asked for most, so words of theirs come oftenest.
        const std::int32_t kind = input.Below(8);
        ValueWord value = {};
        if (kind < 4) value.number = static_cast<float>(input.Byte()) / 255.0f;
        if (kind == 4) value.bits = input.Byte();
        if (kind == 5 || kind == 6) value.bits = input.Word();
        word = kind == 7 ? std::nullopt : std::optional(value.bits);
    }
}

double ReadTime(FuzzInput& input) {
    static constexpr double kTimes[] = {0.0,
                                        -1.0,
                                        1e300,
                                        -1e300,
                                        std::numeric_limits<double>::infinity(),
                                        -std::numeric_limits<double>::infinity(),
                                        std::numeric_limits<double>::quiet_NaN(),
                                        std::numeric_limits<double>::denorm_min()};
    const std::int32_t kind = input.Below(64);
    if (kind < 8) return kTimes[kind];
    // Hours into a clip the scratches' lives up to there are told first: sound, but it takes the fuzzer's time.
    if (kind < 16) return std::fmod(input.Double(), 4000.0);
    return input.Byte() / 30.0;
}

// The state that a road of its own renders on, beside the library's.
struct OtherRoad {
    render::RenderState state;
    render::RenderOptions options;
};

class Run {
  public:
    Run(FuzzInput& input, IEffectLibrary& library) : m_input(input), m_library(library) {
        m_reference.options.road = render::Road::kByStages;
        m_reference.options.form = render::Form::kPlain;
        const std::int32_t choice = input.Byte();
        constexpr render::Form kForms[] = {render::Form::kPlain, render::Form::kSse2, render::Form::kAvx2,
                                           render::Form::kAvx512};
        m_other.options.form = std::min(kForms[choice % 4], render::BestForm());
        if (choice / 4 % 2 != 0) m_other.options.streamedBytes = 0;
        const std::uint32_t seed = input.Byte();
        for (render::RenderState* state : {ProcessSession().state, &m_reference.state, &m_other.state}) {
            *state = {};
            state->random.Seed(seed);
        }
        // What a menu keeps when it is told nonsense must not come from the input before.
        WordHost zeros;
        zeros.words.fill(0u);
        CurrentMasterSettings()->ReadFromHost(zeros);
    }

    void Frame() {
        const std::int32_t what = m_input.Below(7);
        if (what < 5) {
            Effect(static_cast<std::size_t>(what));
        } else {
            Convert(what == 5);
        }
    }

  private:
    void Effect(std::size_t index) {
        if (!m_effects[index]) {
            m_effects[index] =
                Reference<IVideoEffect>::Adopt(m_library.CreateEffect(static_cast<std::uint32_t>(index)));
        }
        IVideoEffect& effect = *m_effects[index];
        ReadWords(m_input, effect, m_host);
        const TimingRecord timing = {0.0, 0.0, ReadTime(m_input)};
        const std::int32_t missing = m_input.Below(64);
        FuzzedFrames frames(m_input, kBgraLayout, kBgraLayout);
        IVideoHost* const host = missing == 1 ? nullptr : &m_host;
        const FrameRecord* const source = missing == 2 ? nullptr : &frames.Source();
        const FrameRecord* const destination = missing == 3 ? nullptr : &frames.Destination();
        const TimingRecord* const when = missing == 4 ? nullptr : &timing;
        const bool isWhole = frames.AreValid() && missing != 2 && missing != 3 && missing != 4;
        if (isWhole) frames.Close(frames.Width());
        const bool isDone = effect.Process(host, source, nullptr, destination, when);
        frames.Open();
        Require(isDone == isWhole);
        void* face = nullptr;
        Require(effect.QueryInterface(&kIidVideoHost, &face) == kStatusOk);
        effect.Release();
        for (OtherRoad* road : {&m_reference, &m_other}) {
            if (!isWhole) {
                // The number counts, though there is no frame.
                RenderFrame(Session(*road), *static_cast<IVideoHost*>(face), source, destination, when);
                continue;
            }
            FuzzedFrames::Copy copy = frames.TakeCopy();
            Require(RenderFrame(Session(*road), *static_cast<IVideoHost*>(face), &copy.source,
                                &copy.destination, when));
            Require(frames.AreAs(copy));
        }
    }

    // All roads read the values that the library's list has just read, and leave in it what they found.
    static RenderSession Session(OtherRoad& road) {
        return {CurrentMasterSettings(), &road.state, road.options};
    }

    void Convert(bool isToBgra) {
        auto processor = Reference<IFrameProcessor>::Adopt(NewProcessor());
        const std::uint8_t alpha = m_input.Byte();
        const PixelLayout& from = isToBgra ? kYcbcrLayout : kBgraLayout;
        const PixelLayout& to = isToBgra ? kBgraLayout : kYcbcrLayout;
        FuzzedFrames frames(m_input, from, to);
        if (frames.AreValid()) frames.Close(isToBgra ? frames.Source().width : frames.Width());
        const bool isDone =
            isToBgra ? processor->ConvertYcbcrToBgra(&frames.Source(), &frames.Destination(), alpha)
                     : processor->ConvertBgraToYcbcr(&frames.Source(), &frames.Destination(), alpha);
        frames.Open();
        Require(isDone == frames.AreValid());
        if (!isDone) return;
        FuzzedFrames::Copy copy = frames.TakeCopy();
        for (std::int32_t y = 0; y < frames.Height(); ++y) {
            const std::uint8_t* source = Row(copy.source, from, y);
            std::uint8_t* destination = Row(copy.destination, to, y);
            if (isToBgra) {
                DecodeRow(source, copy.source.width, destination, frames.Width(), alpha);
            } else {
                EncodeRow(source, destination, frames.Width());
            }
        }
        Require(frames.AreAs(copy));
    }

    // A processor takes the form that the environment names when it is made.
    IFrameProcessor* NewProcessor() {
        static constexpr const char* kForms[] = {"plain", "sse2", "avx2", "avx512"};
        setenv("VELMORA_FORM", kForms[m_input.Below(4)], 1);
        IFrameProcessor* const processor = m_library.CreateFrameProcessor();
        unsetenv("VELMORA_FORM");
        return processor;
    }

    static std::uint8_t* Row(const FrameRecord& frame, const PixelLayout& layout, std::int32_t y) {
        const std::int64_t step = frame.rowStep < 0 ? -std::int64_t{frame.rowStep} : frame.rowStep;
        std::int64_t offset = step * (frame.yOrigin + y) + layout.columnOffset(frame.xOrigin);
        if (frame.rowStep < 0) offset -= step * (std::int64_t{frame.yOrigin} + frame.height - 1);
        return static_cast<std::uint8_t*>(frame.pixels) + offset;
    }

    static void DecodeRow(const std::uint8_t* source, std::int32_t sourceWidth, std::uint8_t* bgra,
                          std::int32_t width, std::uint8_t alpha) {
        std::array<std::uint8_t, 3 * 256> rgb;
        Require(sourceWidth <= 256);
        render::YcbcrRowToRgb(source, rgb.data(), sourceWidth);
        for (std::size_t x = 0; x < static_cast<std::size_t>(width); ++x) {
            for (std::size_t channel = 0; channel < 3; ++channel)
                bgra[4 * x + channel] = rgb[3 * x + 2 - channel];
            bgra[4 * x + 3] = alpha;
        }
    }

    static void EncodeRow(const std::uint8_t* bgra, std::uint8_t* destination, std::int32_t width) {
        std::array<std::uint8_t, 3 * 256> rgb;
        for (std::size_t x = 0; x < static_cast<std::size_t>(width); ++x) {
            for (std::size_t channel = 0; channel < 3; ++channel)
                rgb[3 * x + channel] = bgra[4 * x + 2 - channel];
        }
        render::RgbRowToYcbcr(rgb.data(), destination, width);
    }

    FuzzInput& m_input;
    IEffectLibrary& m_library;
    WordHost m_host;
    std::array<Reference<IVideoEffect>, 5> m_effects;
    OtherRoad m_reference, m_other;
};

}  // namespace
}  // namespace velmora::fuzz

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace velmora;
    // One for the process: each new one keeps a list of settings until the end.
    static IEffectLibrary& library = *testing::LoadedLibrary().getEffectsLibrary();
    fuzz::FuzzInput input(data, size);
    fuzz::Run run(input, library);
    for (int frame = 0; frame < 6 && (frame == 0 || !input.AtEnd()); ++frame) run.Frame();
    return 0;
}

// Frames through the binary interface: effects and conversions with any geometry, values and times, several in a row
// on the state that the library keeps. A frame must be refused, or processed so that nothing else is touched and its
// pixels match those of the reference, which gets frames with nothing around them.

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <functional>
#include <limits>
#include <vector>

#include "api/host_api.h"
#include "api/reference.h"
#include "effects/process_state.h"
#include "effects/render_session.h"
#include "programs/reelcheck/library.h"
#include "programs/reelcheck/playing_host.h"
#include "tests/common/library_under_test.h"
#include "tests/fuzz/fuzz_input.h"

namespace velmora::fuzz {
namespace {

using reelcheck::Frame;
using reelcheck::Layout;
using reelcheck::Packing;
using reelcheck::PlayingHost;

// What processes a pair of frames: the library, or one of the two references. False when the frames are refused.
enum class Runner { kLibrary, kReference, kOtherLevel };
constexpr Runner kRunners[] = {Runner::kLibrary, Runner::kReference, Runner::kOtherLevel};
using Operation = std::function<bool(Runner, const FrameRecord& source, const FrameRecord& destination)>;

// Mostly small: the same edge cases occur there and take less time.
Layout ReadLayout(FuzzInput& input) {
    const auto side = [&input](std::int32_t most) {
        const std::int32_t number = input.Byte();
        return 1 + number % (number < 192 ? 24 : most);
    };
    Layout layout{side(130), side(48)};
    const std::int32_t origins = input.Byte(), padding = input.Byte();
    layout.xOrigin = origins % 8;
    layout.yOrigin = origins / 8 % 8;
    layout.padding = padding / 2;
    layout.bottomUp = padding % 2 != 0;
    return layout;
}

double ReadTime(FuzzInput& input) {
    if (input.Below(8) != 0) return input.Byte() / 30.0;
    const double time = input.Double();
    // Hours into a clip the lives of all earlier scratches are computed first: correct, but it costs the fuzzer time.
    return std::abs(time) < 1e9 ? std::fmod(time, 4000.0) : time;
}

// The public header's rule, in 64 bits: is this a valid frame?
bool IsFrame(const FrameRecord& frame, Packing packing) {
    constexpr std::int64_t kMost = std::numeric_limits<std::int32_t>::max();
    const std::int64_t width = std::int64_t{frame.xOrigin} + frame.width, step = frame.rowStep,
                       pixels = packing == Packing::kBgra ? width : (width + 1) / 2;
    return frame.width >= 1 && frame.height >= 1 && frame.xOrigin >= 0 && frame.yOrigin >= 0 &&
           width <= kMost && std::int64_t{frame.yOrigin} + frame.height <= kMost && std::abs(step) <= kMost &&
           pixels * 4 <= std::abs(step);
}

// Replaces one number of the record by an arbitrary one, so that the record becomes invalid.
void Spoil(FuzzInput& input, Packing packing, FrameRecord& frame) {
    std::int32_t* const numbers[] = {&frame.width, &frame.height, &frame.rowStep, &frame.xOrigin,
                                     &frame.yOrigin};
    *numbers[input.Below(5)] = static_cast<std::int32_t>(input.Word());
    if (IsFrame(frame, packing)) frame.pixels = nullptr;
}

// Runs the references on the pixels alone, as they were before, and compares their result with all bytes of the
// memory that holds the destination at offset `at`. `before` is that memory's previous content.
void Compare(const Frame& source, Frame& destination, std::size_t at, const reelcheck::GuardedMemory& home,
             const std::vector<std::uint8_t>& before, Packing from, Packing to, const Operation& operation) {
    for (const Runner runner : {Runner::kReference, Runner::kOtherLevel}) {
        Frame plainSource({source.Shape().width, source.Shape().height}, from);
        Frame plain({destination.Shape().width, destination.Shape().height}, to);
        plainSource.CopyRegion(source);
        std::memcpy(destination.Bytes(), before.data() + at, destination.Size());
        plain.CopyRegion(destination);
        Require(operation(runner, plainSource.Record(), plain.Record()));
        destination.CopyRegion(plain);
        std::vector<std::uint8_t> made = before;
        std::memcpy(made.data() + at, destination.Bytes(), destination.Size());
        Require(std::memcmp(made.data(), home.Data(), home.Size()) == 0);
    }
}

// Runs the operation on two frames in separate memory, in the same memory or overlapping.
void Try(FuzzInput& input, Packing from, Packing to, const Operation& operation) {
    enum Kind { kSame = 1, kSpoiltSource, kSpoiltDestination, kOverlapping };
    const std::int32_t kind = input.Below(8);
    const Layout sourceLayout = ReadLayout(input);
    const Layout destinationLayout = kind == kSame ? sourceLayout : ReadLayout(input);
    Frame source(sourceLayout, from), destination(destinationLayout, to);
    FrameRecord in = source.Record(), out = destination.Record();
    if (kind == kSpoiltSource) Spoil(input, from, in);
    if (kind == kSpoiltDestination) Spoil(input, to, out);
    if (kind == kSpoiltSource || kind == kSpoiltDestination) {
        for (const Runner runner : kRunners) Require(!operation(runner, in, out));
        return;
    }
    const std::int32_t offset = kind == kOverlapping ? static_cast<std::int32_t>(input.Word()) % 4096 : 0;
    const bool isShared = kind == kSame || kind == kOverlapping;
    const std::size_t sourceAt = static_cast<std::size_t>(std::max(-offset, 0));
    const std::size_t destinationAt = static_cast<std::size_t>(std::max(offset, 0));
    reelcheck::Dice dice(input.Byte(), "frames");
    source.Paint(dice);
    destination.Paint(dice);

    const reelcheck::GuardedMemory home(
        std::max(isShared ? sourceAt + source.Size() : 0, destinationAt + destination.Size()),
        input.Below(2) == 0 ? reelcheck::Edge::kFront : reelcheck::Edge::kBack);
    const auto moveHome = [&home](const Frame& frame, std::size_t at, FrameRecord& record) {
        record.pixels = home.Data() + at + (static_cast<std::uint8_t*>(record.pixels) - frame.Bytes());
    };
    std::memcpy(home.Data() + destinationAt, destination.Bytes(), destination.Size());
    moveHome(destination, destinationAt, out);
    if (isShared) {
        std::memcpy(home.Data() + sourceAt, source.Bytes(), source.Size());
        moveHome(source, sourceAt, in);
    } else {
        source.ForbidWriting();
    }
    const std::vector<std::uint8_t> before(home.Data(), home.Data() + home.Size());
    Require(operation(Runner::kLibrary, in, out));
    Compare(source, destination, destinationAt, home, before, from, to, operation);
}

// The state that a reference renders with, separate from the library's.
struct ReferenceRun {
    render::RenderState state;
    render::RenderOptions options;
};

class Run {
  public:
    Run(FuzzInput& input, IEffectLibrary& library) : m_input(input), m_library(library) {
        m_plain.options.level = render::SimdLevel::kPlain;
        const std::int32_t choice = input.Byte();
        m_other.options.level = std::min(render::kSimdLevels[choice % 5], render::BestSimdLevel());
        if (choice / 5 % 2 != 0) m_other.options.streamedBytes = 0;
        const std::uint32_t seed = input.Byte();
        for (render::RenderState* state : {ProcessSession().state, &m_plain.state, &m_other.state}) {
            *state = {};
            state->random.Seed(seed);
        }
        // A menu that gets an invalid value keeps its last one, which must not come from the previous input.
        CurrentMasterSettings()->ReadFromHost(m_host);
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
    void ReadValues(IVideoEffect& effect) {
        m_host.values = {};
        ChoosePreset(m_host, effect, m_input.Byte() % 32u);
        for (std::int32_t left = m_input.Below(40); left > 0; --left) {
            ValueWord& value = m_host.values[static_cast<std::size_t>(m_input.Below(40))];
            const std::int32_t kind = m_input.Below(4);
            if (kind < 2) value.number = static_cast<float>(m_input.Byte()) / 255.0f;
            if (kind == 2) value.bits = m_input.Byte();
            if (kind == 3) value.bits = m_input.Word();
        }
    }

    void Effect(std::size_t index) {
        if (!m_effects[index]) {
            m_effects[index] =
                Reference<IVideoEffect>::Adopt(m_library.CreateEffect(static_cast<std::uint32_t>(index)));
        }
        IVideoEffect& effect = *m_effects[index];
        ReadValues(effect);
        const double seconds = ReadTime(m_input);
        void* found = nullptr;
        Require(effect.QueryInterface(&kIidVideoHost, &found) == kStatusOk);
        const auto owner = Reference<IVideoHost>::Adopt(static_cast<IVideoHost*>(found));
        const auto render = [&](Runner runner, const FrameRecord& source, const FrameRecord& destination) {
            if (runner == Runner::kLibrary) return Process(effect, &m_host, source, destination, seconds);
            // The references use the values that the library's list has just read, and leave the list as they found
            // it.
            ReferenceRun& reference = runner == Runner::kReference ? m_plain : m_other;
            const TimingRecord timing = {0.0, 0.0, seconds};
            return RenderFrame({CurrentMasterSettings(), &reference.state, reference.options}, *owner,
                               &source, &destination, &timing);
        };
        Try(m_input, Packing::kBgra, Packing::kBgra, render);
    }

    void Convert(bool isToBgra) {
        static constexpr const char* kLevels[] = {"plain", "sse2", "ssse3", "avx2", "avx512"};
        const char* const level = kLevels[m_input.Below(5)];
        const std::uint8_t alpha = m_input.Byte();
        const auto convert = [&](Runner runner, const FrameRecord& source, const FrameRecord& destination) {
            // A processor takes the SIMD level named in the environment when it is created.
            setenv("VELMORA_SIMD", runner == Runner::kLibrary ? level : kLevels[0], 1);
            const auto processor = Reference<IFrameProcessor>::Adopt(m_library.CreateFrameProcessor());
            unsetenv("VELMORA_SIMD");
            return isToBgra ? processor->ConvertYcbcrToBgra(&source, &destination, alpha)
                            : processor->ConvertBgraToYcbcr(&source, &destination, alpha);
        };
        Try(m_input, isToBgra ? Packing::kYcbcr : Packing::kBgra, isToBgra ? Packing::kBgra : Packing::kYcbcr,
            convert);
    }

    FuzzInput& m_input;
    IEffectLibrary& m_library;
    PlayingHost m_host;
    std::array<Reference<IVideoEffect>, 5> m_effects;
    ReferenceRun m_plain, m_other;
};

}  // namespace
}  // namespace velmora::fuzz

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace velmora;
    // One per process: each new one keeps a list of settings until the process ends.
    static IEffectLibrary& library = *testing::LoadedLibrary().getEffectsLibrary();
    fuzz::FuzzInput input(data, size);
    fuzz::Run run(input, library);
    for (int frame = 0; frame < 6 && (frame == 0 || !input.AtEnd()); ++frame) run.Frame();
    return 0;
}

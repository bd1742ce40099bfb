// What the library allocates, and what it does when it cannot.

#include <vector>

#include "programs/reelcheck/checks.h"
#include "programs/reelcheck/fail_each.h"
#include "programs/reelcheck/library.h"
#include "programs/reelcheck/playing_host.h"
#include "programs/reelcheck/system.h"

namespace velmora::reelcheck {
namespace {

// A module frees everything when it is unloaded; a linked library keeps the settings of each library object.
std::uint64_t BlocksKept() noexcept {
    return IsModule() ? 0 : kBlocksOfSettings;
}

// A whole session under a watch: loads, opens, renders a frame, closes and unloads.
class Visit {
  public:
    Visit() : m_source(Layout{32, 24}), m_destination(Layout{32, 24}) {
        for (ValueWord& value : m_host.values) value.number = 1.0f;
    }

    // False when there was no library object.
    bool Pay(const std::string& path, std::uint64_t failing) {
        std::unique_ptr<Library> library;
        if (!IsModule())
            library = Library::TryLoad(path);  // outside the watch: this is the program's own memory
        const AllocationWatch watch(failing);
        if (library == nullptr) library = Library::TryLoad(path);
        const bool isOpened = library != nullptr && Use(library->getEffectsLibrary);
        if (IsModule()) library.reset();
        m_count = watch.Count();
        return isOpened;
    }
    [[nodiscard]] std::uint64_t Count() const noexcept { return m_count; }

  private:
    bool Use(GetEffectsLibraryFunction getEffectsLibrary) {
        const auto object = Reference<IEffectLibrary>::Adopt(getEffectsLibrary());
        if (!object) return false;
        if (const auto effect = Reference<IVideoEffect>::Adopt(object->CreateEffect(kEffectCount - 1))) {
            const FrameRecord from = m_source.Record(), to = m_destination.Record();
            const TimingRecord timing = {0, 0, 1.0};
            effect->Process(&m_host, &from, nullptr, &to, &timing);
        }
        return true;
    }

    Frame m_source, m_destination;
    PlayingHost m_host;
    std::uint64_t m_count = 0;
};

}  // namespace

void CheckLoading(CheckContext& context) {
    const int rounds = context.Rounds(200, 2000);
    constexpr int kSettled = 10;  // rounds until the system has loaded everything it keeps
    ProcessFigures settled;
    Visit visit;
    for (int round = 0; round < rounds; ++round) {
        SetPlace("round %d", round);
        const std::uint64_t before = LiveBlocks();
        Require(visit.Pay(context.libraryPath, 0), "there is no library");
        Require(visit.Count() > 0, "no allocation is seen: the check is blind");
        // A linked library allocates the buffers that it keeps for its frames in the first round.
        if (round > 0) Require(LiveBlocks() <= before + BlocksKept(), "blocks are lost");
        if (round == kSettled) settled = FiguresNow();
    }
    SetPlace("%d rounds", rounds);
    // Natively the settings of each library object stay allocated.
    const std::int64_t perRound = IsModule() ? 0 : 8 * 1024;
    RequireNoGrowth(settled, FiguresNow(), 256 * 1024 + perRound * rounds);
}

void CheckLoadFailures(CheckContext& context) {
    Visit visit;
    FailEach(context, "visit", static_cast<std::uint64_t>(context.Rounds(120, 100000)), BlocksKept(),
             [&](std::uint64_t failing) {
                 const bool isOpened = visit.Pay(context.libraryPath, failing);
                 Require(isOpened || failing != 0, "there is no library");
                 return visit.Count();
             });
}

void CheckCreateFailures(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    const auto tryObject = [&](const char* name, auto create) {
        FailEach(context, name, 100, 0, [&](std::uint64_t failing) {
            std::uint64_t count = 0;
            bool isMade = false;
            {
                const AllocationWatch watch(failing);
                isMade = bool{Reference<com::IUnknown>::Adopt(create())};
                count = watch.Count();
            }
            Require(isMade == (failing == 0), isMade ? "is made without memory" : "is not made");
            return count;
        });
    };
    for (std::uint32_t i = 0; i < kEffectCount; ++i) {
        tryObject(Text("effect %u", i).c_str(), [&] { return library->CreateEffect(i); });
    }
    tryObject("frame processor", [&] { return library->CreateFrameProcessor(); });
    tryObject("preset saver", [&] { return library->CreatePresetSaver(); });
}

void CheckTableAllocations(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    for (std::uint32_t index = 0; index < kEffectCount; ++index) {
        const Reference<IVideoEffect> effect = library.Effect(index);
        SetPlace("%s", effect->GetName());
        ParamDescriptor descriptor = {};
        PresetCell cell = {};
        const AllocationWatch watch;
        for (std::uint32_t i = 0; effect->GetParamInfo(i, &descriptor); ++i) {
        }
        for (std::uint32_t preset = 0; effect->GetPresetName(preset) != nullptr; ++preset) {
            for (std::uint32_t i = 0; effect->GetPresetValue(preset, i, &cell); ++i) {
            }
        }
        if (watch.Count() != 0) Fail("describing allocates");
    }
}

namespace {

// Allocations of one frame.
std::uint64_t CountFrame(IVideoEffect& effect, IVideoHost& host, const FrameRecord& source,
                         const FrameRecord& destination, double seconds, std::uint64_t failing = 0) {
    const TimingRecord timing = {0, 0, seconds};
    const AllocationWatch watch(failing);
    effect.Process(&host, &source, nullptr, &destination, &timing);
    return watch.Count();
}

}  // namespace

// A frame works in buffers that the library keeps between frames. Only a frame that is rendered in place allocates a
// copy of its source, when the picture moves over itself.
void CheckFrameAllocations(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    for (const Layout& size : {Layout{320, 240}, Layout{1280, 720}, Layout{64, 64}}) {
        for (std::uint32_t index = 0; index < kEffectCount; ++index) {
            const Reference<IVideoEffect> effect = library.Effect(index);
            const EffectFacts facts = EffectFacts::Of(*effect);
            Frame source(size), destination(size);
            source.Paint(context.dice);
            const FrameRecord from = source.Record(), to = destination.Record();
            PlayingHost host;
            ChooseFull(host, facts);
            CountFrame(*effect, host, from, to, 0.0);  // allocates the buffers
            for (int i = 1; i < context.Rounds(12, 100); ++i) {
                SetPlace("%s, %dx%d, frame %d", facts.name.c_str(), size.width, size.height, i);
                ChooseFair(host, facts, context.dice);
                const std::uint64_t apart = CountFrame(*effect, host, from, to, i / 30.0);
                if (apart != 0) Fail(Text("%d allocations", static_cast<int>(apart)));
                const std::uint64_t inPlace = CountFrame(*effect, host, to, to, i / 30.0);
                if (inPlace > 1) Fail(Text("%d allocations in place", static_cast<int>(inPlace)));
            }
        }
    }
    SetPlace("frame processor");
    const Reference<IFrameProcessor> processor = library.Processor();
    Frame bgra(Layout{320, 240}), packed(Layout{320, 240}, Packing::kYcbcr);
    const FrameRecord pixels = bgra.Record(), groups = packed.Record();
    FrameRecord inPlace = pixels;
    inPlace.rowStep = groups.rowStep;
    processor->ConvertBgraToYcbcr(&pixels, &inPlace, 0);  // allocates its buffer
    const AllocationWatch watch;
    processor->ConvertBgraToYcbcr(&pixels, &groups, 0);
    processor->ConvertYcbcrToBgra(&groups, &pixels, 0);
    processor->ConvertBgraToYcbcr(&pixels, &inPlace, 0);
    if (watch.Count() != 0) Fail("converting allocates");
}

// Without memory a frame may lack a stage, but it stays within its rectangle. Once memory is back it is complete.
void CheckFrameFailures(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    std::int32_t width = 1400;  // wider each time, so that the kept buffers are too small
    for (std::uint32_t index = 0; index < kEffectCount; ++index) {
        const Reference<IVideoEffect> effect = library.Effect(index);
        const EffectFacts facts = EffectFacts::Of(*effect);
        PlayingHost host;
        ChooseFull(host, facts);
        for (const bool inPlace : {false, true}) {
            bool hasFailed = true;
            for (std::uint64_t failing = 1; hasFailed; ++failing) {
                width += 40;
                SetPlace("%s, %d wide, %s, allocation %d fails", facts.name.c_str(), width,
                         inPlace ? "in place" : "apart", static_cast<int>(failing));
                const Layout size{width, 700};
                Frame source(size), destination(size);
                source.Paint(context.dice);
                destination.CopyRegion(source);
                const FrameRecord to = destination.Record();
                const FrameRecord from = inPlace ? to : source.Record();
                hasFailed = CountFrame(*effect, host, from, to, 1.0, failing) >= failing;
                const std::uint64_t kept = LiveBlocks();
                RenderInside(*effect, host, source, destination, 1.0);
                const std::uint64_t whole = destination.Digest();
                destination.CopyRegion(source);
                Require(Process(*effect, &host, to, to, 1.0) && destination.Digest() == whole,
                        "with memory again the picture is not whole");
                Require(LiveBlocks() <= kept, "a block is lost");
            }
        }
    }
}

// Many frames with everything changing: nothing may grow.
void CheckEndurance(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    const Layout size{640, 360};
    Frame source(size), destination(size);
    source.Paint(context.dice);
    std::vector<Reference<IVideoEffect>> effects;
    std::vector<EffectFacts> facts;
    for (std::uint32_t i = 0; i < kEffectCount; ++i) {
        effects.push_back(library.Effect(i));
        facts.push_back(EffectFacts::Of(*effects[i]));
    }
    PlayingHost host;
    ProcessFigures settled;
    std::uint64_t settledBlocks = 0;
    const int frames = context.Rounds(1000, 20000);
    for (int i = 0; i < frames; ++i) {
        SetPlace("frame %d", i);
        const std::size_t index = static_cast<std::size_t>(i / 3) % effects.size();
        ChoosePreset(host, *effects[index],
                     static_cast<std::uint32_t>(i) % static_cast<std::uint32_t>(facts[index].presets.size()));
        CountFrame(*effects[index], host, source.Record(), destination.Record(), i / 30.0);
        if (i == frames / 10) settled = FiguresNow(), settledBlocks = LiveBlocks();
    }
    Require(LiveBlocks() <= settledBlocks, "blocks are lost");
    RequireNoGrowth(settled, FiguresNow(), 256 * 1024);
}

}  // namespace velmora::reelcheck

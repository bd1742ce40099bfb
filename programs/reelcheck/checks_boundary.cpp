// The objects: exports, counts, interfaces, null pointers, lifetime, threads.

#include <atomic>
#include <cstring>
#include <thread>
#include <vector>

#include "programs/reelcheck/checks.h"
#include "programs/reelcheck/library.h"
#include "programs/reelcheck/playing_host.h"

namespace velmora::reelcheck {

void CheckExports(CheckContext& context) {
    const Library library(context.libraryPath);
    Require(library.canUnload(), "a fresh library says that it must not be unloaded");
    Reference<IEffectLibrary> first = library.Open(), second = library.Open();
    Require(first != second, "two calls give one library object");
    Require(!library.canUnload(), "the library may be unloaded while an object lives");
    first.Reset();
    Require(!library.canUnload(), "the library may be unloaded while a second object lives");
    Require(std::strlen(second->GetLibraryName()) > 0, "the library has no name");
    Require(second->GetShellServices() != nullptr, "the library has no shell services");
    for (std::uint32_t i = 0; i < kEffectCount; ++i) {
        Require(bool{Reference<IVideoEffect>::Adopt(second->CreateEffect(i))}, "an effect is missing");
    }
    for (const std::uint32_t index : {std::uint32_t{kEffectCount}, 100u, 0x80000000u, 0xFFFFFFFFu}) {
        Require(second->CreateEffect(index) == nullptr, "there is an effect after the last");
    }
    second.Reset();
    Require(library.canUnload(), "the library may not be unloaded when its last object is gone");
}

namespace {

constexpr Guid kStranger = {1, 2, 3, {4, 5, 6, 7, 8, 9, 10, 11}};

// Every object answers to IUnknown and to its own identifier, if it has one, and to no other.
void CheckInterfaces(com::IUnknown& object, const Guid* own) {
    void* found = nullptr;
    Require(object.QueryInterface(&kIidUnknown, &found) == kStatusOk && found == &object,
            "does not answer to IUnknown with itself");
    Require(object.Release() == 1, "QueryInterface does not count");
    if (own != nullptr) {
        Require(object.QueryInterface(own, &found) == kStatusOk && found == &object,
                "does not answer to its own identifier");
        Require(object.Release() == 1, "QueryInterface does not count");
    }
    found = &object;
    Require(object.QueryInterface(&kStranger, &found) == kStatusNoInterface && found == nullptr,
            "does not refuse a stranger's identifier");
    found = &object;
    Require(object.QueryInterface(nullptr, &found) == kStatusNoInterface && found == nullptr,
            "does not refuse a null identifier");
    Require(object.QueryInterface(&kIidUnknown, nullptr) == kStatusFailure, "does not refuse a null place");
}

void CheckCounts(com::IUnknown& object) {
    constexpr std::uint32_t kMany = 1000;
    for (std::uint32_t i = 0; i < kMany; ++i) Require(object.AddRef() == i + 2, "AddRef counts wrongly");
    for (std::uint32_t i = kMany; i > 0; --i) Require(object.Release() == i, "Release counts wrongly");
}

void CheckObject(const char* name, com::IUnknown& object, const Guid* own) {
    SetPlace("%s", name);
    CheckInterfaces(object, own);
    CheckCounts(object);
}

}  // namespace

void CheckReferences(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    CheckObject("library", *library.Get(), &kIidEffectLibrary);
    CheckObject("frame processor", *library.Processor(), nullptr);
    CheckObject("preset saver", *library.Saver(), &kIidPresetSaver);
    for (std::uint32_t i = 0; i < kEffectCount; ++i) {
        const Reference<IVideoEffect> effect = library.Effect(i);
        CheckObject(effect->GetName(), *effect, &kIidVideoEffect);
        Require(bool{QueryFor<IVideoHost>(*effect, kIidVideoHost)}, "an effect has no host's interface");
    }
}

void CheckNullArguments(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    const Frame frame(Layout{8, 6});
    const FrameRecord record = frame.Record();
    const TimingRecord timing = {0, 0, 1.0};
    for (std::uint32_t i = 0; i < kEffectCount; ++i) {
        const Reference<IVideoEffect> effect = library.Effect(i);
        SetPlace("%s", effect->GetName());
        PlayingHost host;
        Require(!effect->GetParamInfo(0, nullptr), "describes a parameter without a record");
        Require(!effect->GetPresetValue(0, 0, nullptr), "copies a preset's value without a record");
        Require(!effect->Process(&host, nullptr, nullptr, &record, &timing), "renders without a source");
        Require(!effect->Process(&host, &record, nullptr, nullptr, &timing), "renders without a destination");
        Require(!effect->Process(&host, &record, nullptr, &record, nullptr), "renders without a time");
        Require(!effect->Process(nullptr, nullptr, nullptr, nullptr, nullptr), "renders without anything");
        Require(effect->Process(nullptr, &record, nullptr, &record, &timing),
                "does not render without a host");
        void* found = nullptr;
        Require(effect->QueryInterface(&kStranger, &found) == kStatusNoInterface,
                "answers to an unknown identifier without a host");
    }
    SetPlace("frame processor");
    const Reference<IFrameProcessor> processor = library.Processor();
    Require(!processor->ConvertYcbcrToBgra(nullptr, &record, 0) &&
                !processor->ConvertYcbcrToBgra(&record, nullptr, 0) &&
                !processor->ConvertBgraToYcbcr(nullptr, &record, 0) &&
                !processor->ConvertBgraToYcbcr(&record, nullptr, 0),
            "converts without a source or destination");
    Require(!processor->Reserved3(nullptr, nullptr, 0) && !processor->Reserved4(nullptr, nullptr, 0) &&
                !processor->Reserved5(nullptr, nullptr, 0),
            "a reserved operation does something");
    SetPlace("texts");
    const auto texts = QueryFor<IMultiLingual>(*library.Get(), kIidMultiLingual);
    if (!texts) return;
    char16_t buffer[4] = {u'?', u'?', u'?', u'?'};
    for (const char* code : {static_cast<const char*>(nullptr), "", "x", "en", "english", "\xFF\xFF"}) {
        for (const char* key : {static_cast<const char*>(nullptr), "", "no such key"}) {
            Require(texts->GetText(code, 4, key, buffer, 4) == 0, "finds a text without a key");
            Require(texts->GetText(code, -1, key, nullptr, 4) == 0, "writes a text without a buffer");
            Require(texts->GetText(code, 4, key, buffer, -5) == 0, "writes a text of negative size");
            Require(texts->LookUpText(code, 4, key, nullptr, nullptr, 0, nullptr) == 0,
                    "finds a text without a key");
        }
    }
}

void CheckOutliving(CheckContext& context) {
    OpenLibrary library(context.libraryPath);
    std::vector<Reference<IVideoEffect>> effects;
    for (std::uint32_t i = 0; i < kEffectCount; ++i) effects.push_back(library.Effect(i));
    const Reference<IFrameProcessor> processor = library.Processor();
    const Reference<IPresetSaver> saver = library.Saver();
    library.Close();
    Frame source(Layout{40, 30}), destination(Layout{40, 30}), packed(Layout{40, 30}, Packing::kYcbcr);
    source.Paint(context.dice);
    for (const Reference<IVideoEffect>& effect : effects) {
        SetPlace("%s", effect->GetName());
        PlayingHost host;
        ChooseFull(host, EffectFacts::Of(*effect));
        for (int i = 0; i < 3; ++i) RenderInside(*effect, host, source, destination, i / 30.0);
    }
    SetPlace("frame processor");
    const FrameRecord from = source.Record(), to = packed.Record();
    Require(processor->ConvertBgraToYcbcr(&from, &to, 0), "does not convert");
    CheckObject("preset saver", *saver, &kIidPresetSaver);
}

void CheckThreads(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    const Reference<IVideoEffect> effect = library.Effect(4);
    const EffectFacts facts = EffectFacts::Of(*effect);
    SetPlace("counting");
    constexpr int kThreads = 4;
    const int rounds = context.Rounds(5000, 500000);
    std::vector<std::thread> counting;
    counting.reserve(kThreads);
    for (int i = 0; i < kThreads; ++i) {
        counting.emplace_back([&effect, rounds] {
            for (int k = 0; k < rounds; ++k) effect->AddRef(), effect->Release();
        });
    }
    for (std::thread& thread : counting) thread.join();
    Require(effect->AddRef() == 2 && effect->Release() == 1, "a count is lost between threads");
    SetPlace("rendering");
    Frame source(Layout{64, 48}), destination(Layout{64, 48});
    source.Paint(context.dice);
    PlayingHost host;
    ChooseFull(host, facts);
    RenderInside(*effect, host, source, destination, 1.0);
    const std::uint64_t expected = destination.Digest();
    for (int i = 0; i < context.Rounds(20, 500); ++i) {
        std::uint64_t digest = 0;
        std::thread([&] {
            const TimingRecord timing = {0, 0, 1.0};
            const FrameRecord from = source.Record(), to = destination.Record();
            if (effect->Process(&host, &from, nullptr, &to, &timing)) digest = destination.Digest();
        }).join();
        Require(digest == expected, "another thread gets another picture");
    }
}

// Against the contract. Film Look draws no random numbers, so its pictures are known; Film Pro uses all of the state.
void CheckFramesAtOnce(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    const int rounds = context.Rounds(30, 1000);
    std::atomic<int> wrong = 0;
    constexpr int kThreads = 4;
    std::vector<std::thread> rendering;
    rendering.reserve(kThreads);
    for (int i = 0; i < kThreads; ++i) {
        rendering.emplace_back([&library, &wrong, rounds, i, dice = Dice(context.dice.Bits(), "")]() mutable {
            const bool isKnown = i < 2;
            const Reference<IVideoEffect> effect = library.Effect(isKnown ? 1 : 4);
            PlayingHost host;
            if (isKnown) ChoosePreset(host, *effect, static_cast<std::uint32_t>(9 + i));
            if (!isKnown) ChooseFull(host, EffectFacts::Of(*effect));
            std::uint64_t first = 0;
            Frame source(Layout{90 + 37 * i, 40});
            source.Paint(dice);
            for (int k = 0; k < rounds; ++k) {
                Frame destination(Layout{90 + 37 * i, isKnown ? 40 : 1 + k % 40});
                const bool isDone = Process(*effect, &host, source.Record(), destination.Record(), k);
                const std::uint64_t digest = destination.Digest();
                if (k == 0) first = digest;
                if (!isDone || (isKnown && digest != first)) ++wrong;
            }
        });
    }
    for (std::thread& thread : rendering) thread.join();
    Require(wrong == 0, Text("%d wrong frames", wrong.load()).c_str());
}

}  // namespace velmora::reelcheck

// The library through its binary boundary.

#include <gtest/gtest.h>

#include <cstring>
#include <limits>
#include <memory>
#include <string>
#include <vector>

#include "api/reference.h"
#include "tests/common/fake_host.h"
#include "tests/common/guarded_frame.h"
#include "tests/common/library_under_test.h"

#if defined(_WIN32)
#include <psapi.h>
#endif

namespace velmora {
namespace {

using testing::FakeHost;
using testing::Geometry;
using testing::GuardedFrame;
using testing::LoadedLibrary;

class Boundary : public ::testing::Test {
  protected:
    LoadedLibrary m_dll;
    Reference<IEffectLibrary> m_library = Reference<IEffectLibrary>::Adopt(m_dll.getEffectsLibrary());

    Reference<IVideoEffect> Effect(std::uint32_t index) {
        return Reference<IVideoEffect>::Adopt(m_library->CreateEffect(index));
    }
};

// "Film Camera" with full jitter, which any frame shows.
void ShakeFully(FakeHost& host) {
    host.SetNumber(0, 1.0f);
    host.SetNumber(1, 1.0f);
    host.SetBits(2, 0xFF000000u);
    host.SetNumber(3, 0.0f);
    host.SetNumber(4, 0.0f);
}

bool Process(IVideoEffect& effect, FakeHost& host, GuardedFrame& source, GuardedFrame& destination,
             double seconds) {
    const FrameRecord in = source.Record(), out = destination.Record();
    const TimingRecord timing = {-1.0, -1.0, seconds};
    return effect.Process(&host, &in, nullptr, &out, &timing);
}

TEST(Unloading, IsAllowedWhenNoLibraryObjectIsAlive) {
    LoadedLibrary dll;
    EXPECT_TRUE(dll.canUnload());
    auto first = Reference<IEffectLibrary>::Adopt(dll.getEffectsLibrary());
    EXPECT_FALSE(dll.canUnload());
    auto second = Reference<IEffectLibrary>::Adopt(dll.getEffectsLibrary());
    EXPECT_NE(first, second);
    auto effect = Reference<IVideoEffect>::Adopt(first->CreateEffect(1));
    first.Reset();
    EXPECT_FALSE(dll.canUnload());
    second.Reset();
    EXPECT_TRUE(dll.canUnload()) << "effects do not count";
    EXPECT_STREQ(effect->GetName(), "Film Look");
}

TEST_F(Boundary, CountsReferences) {
    IEffectLibrary* library = m_dll.getEffectsLibrary();
    EXPECT_EQ(library->AddRef(), 2u);
    EXPECT_EQ(library->AddRef(), 3u);
    EXPECT_EQ(library->Release(), 2u);
    EXPECT_EQ(library->Release(), 1u);
    EXPECT_EQ(library->Release(), 0u);
    IVideoEffect* effect = m_library->CreateEffect(0);
    EXPECT_EQ(effect->AddRef(), 2u);
    EXPECT_EQ(effect->Release(), 1u);
    EXPECT_EQ(effect->Release(), 0u);
}

TEST_F(Boundary, FindsFaces) {
    Reference<IVideoEffect> effect = Effect(0);
    auto processor = Reference<IFrameProcessor>::Adopt(m_library->CreateFrameProcessor());
    auto saver = Reference<IPresetSaver>::Adopt(m_library->CreatePresetSaver());
    ASSERT_TRUE(effect && processor && saver);
    const Guid stranger = {1, 2, 3, {4, 5, 6, 7, 8, 9, 10, 11}};
    struct Row {
        const char* name;
        com::IUnknown* object;
        const Guid* iid;
        const void* face;  // null: no such interface
    };
    const Row rows[] = {
        {"library as unknown", m_library.Get(), &kIidUnknown, m_library.Get()},
        {"library", m_library.Get(), &kIidEffectLibrary, m_library.Get()},
        {"library as effect", m_library.Get(), &kIidVideoEffect, nullptr},
        {"library as stranger", m_library.Get(), &stranger, nullptr},
        {"effect as unknown", effect.Get(), &kIidUnknown, effect.Get()},
        {"effect", effect.Get(), &kIidVideoEffect, effect.Get()},
        {"effect as library", effect.Get(), &kIidEffectLibrary, nullptr},
        {"processor as unknown", processor.Get(), &kIidUnknown, processor.Get()},
        {"processor as effect", processor.Get(), &kIidVideoEffect, nullptr},
        {"saver as unknown", saver.Get(), &kIidUnknown, saver.Get()},
        {"saver", saver.Get(), &kIidPresetSaver, saver.Get()},
        {"saver as stranger", saver.Get(), &stranger, nullptr},
    };
    for (const Row& row : rows) {
        void* out = &out;
        const Status status = row.object->QueryInterface(row.iid, &out);
        EXPECT_EQ(status, row.face != nullptr ? kStatusOk : kStatusNoInterface) << row.name;
        EXPECT_EQ(out, row.face) << row.name;
        if (status == kStatusOk) row.object->Release();
    }
    EXPECT_EQ(saver->QueryInterface(&kIidUnknown, nullptr), kStatusFailure);
}

TEST_F(Boundary, OffersFiveEffectsAndTheirCompanions) {
    EXPECT_STREQ(m_library->GetLibraryName(), "Velmora Reel Effects");
    const char* names[] = {"Film Camera", "Film Look", "Film Damage", "Film Express", "Film Pro"};
    for (std::uint32_t i = 0; i < 5; ++i) {
        EXPECT_STREQ(Effect(i)->GetName(), names[i]);
        EXPECT_EQ(Effect(i)->GetKind(), 1);
    }
    EXPECT_EQ(m_library->CreateEffect(5), nullptr);
    EXPECT_EQ(m_library->CreateEffect(0xFFFFFFFFu), nullptr);
    EXPECT_NE(m_library->GetShellServices(), nullptr);
}

// The tables of an interface, called by slot as a host of another compiler does.
TEST_F(Boundary, KeepsItsSlots) {
    Reference<IVideoEffect> effect = Effect(2);
    void** table = *reinterpret_cast<void***>(effect.Get());
    using GetName = const char*(VM_CALL*)(void*);
    using GetPresetName = const char*(VM_CALL*)(void*, std::uint32_t);
    EXPECT_STREQ(reinterpret_cast<GetName>(table[3])(effect.Get()), "Film Damage");
    EXPECT_STREQ(reinterpret_cast<GetPresetName>(table[7])(effect.Get(), 7), "Water Damage");
    void** libraryTable = *reinterpret_cast<void***>(m_library.Get());
    EXPECT_STREQ(reinterpret_cast<GetName>(libraryTable[3])(m_library.Get()), "Velmora Reel Effects");
    using Create = void*(VM_CALL*)(void*);
    auto saver = Reference<com::IUnknown>::Adopt(
        static_cast<com::IUnknown*>(reinterpret_cast<Create>(libraryTable[8])(m_library.Get())));
    EXPECT_NE(saver.Get(), nullptr);
}

TEST_F(Boundary, RendersForEffectsThatOutliveTheLibrary) {
    Reference<IVideoEffect> effect = Effect(0);
    m_library.Reset();
    FakeHost host;
    ShakeFully(host);
    GuardedFrame source{Geometry{30, 20}}, destination{Geometry{30, 20}};
    source.FillRandom(1);
    EXPECT_TRUE(Process(*effect, host, source, destination, 1.0));
}

TEST_F(Boundary, RefusesFramesItCannotUseAndReadsNoParameterThen) {
    Reference<IVideoEffect> effect = Effect(0);
    FakeHost host;
    GuardedFrame good{Geometry{8, 6}};
    const FrameRecord valid = good.Record();
    const TimingRecord timing = {0, 0, 1.0};
    FrameRecord noPixels = valid, narrow = valid, flat = valid, shifted = valid;
    noPixels.pixels = nullptr;
    narrow.rowStep = 31;
    flat.height = 0;
    shifted.xOrigin = -1;
    const GuardedFrame before = good;
    for (const FrameRecord* bad : {static_cast<const FrameRecord*>(nullptr), &std::as_const(noPixels),
                                   &std::as_const(narrow), &std::as_const(flat), &std::as_const(shifted)}) {
        EXPECT_FALSE(effect->Process(&host, bad, nullptr, &valid, &timing));
        EXPECT_FALSE(effect->Process(&host, &valid, nullptr, bad, &timing));
    }
    EXPECT_FALSE(effect->Process(&host, &valid, nullptr, &valid, nullptr));
    EXPECT_TRUE(host.requests.empty());
    EXPECT_EQ(good.Bytes(), before.Bytes());
    EXPECT_TRUE(effect->Process(nullptr, &valid, nullptr, &valid, &timing)) << "every value reads as 0";
}

TEST_F(Boundary, WritesNothingButTheProcessedRectangle) {
    for (std::uint32_t index = 0; index < 5; ++index) {
        Reference<IVideoEffect> effect = Effect(index);
        FakeHost host;
        for (std::uint32_t i = 0; i < 27; ++i) {
            ParamDescriptor descriptor = {};
            if (!effect->GetParamInfo(i, &descriptor)) break;
            if (descriptor.kind == kKindSlider) host.SetNumber(i, 0.8f);
            if (descriptor.kind == kKindCheckBox) host.SetBits(i, 1);
            if (descriptor.kind == kKindMenu) host.SetBits(i, i % 7);
            if (descriptor.kind == kKindColour) host.SetBits(i, 0x00336699);
        }
        for (const Geometry& shape :
             {Geometry{1, 1}, Geometry{2, 3, 1, 1, 0, true}, Geometry{33, 17, 3, 2, 5},
              Geometry{64, 48, 0, 0, 1, true}, Geometry{131, 5}}) {
            GuardedFrame source(shape), destination(Geometry{shape.width + 3, shape.height + 2, 2, 1, 7});
            source.FillRandom(1), destination.FillRandom(2);
            const GuardedFrame before = destination, untouched = source;
            ASSERT_TRUE(Process(*effect, host, source, destination, 2.0));
            EXPECT_TRUE(destination.OnlyRegionDiffers(before, shape.width, shape.height));
            EXPECT_EQ(source.Bytes(), untouched.Bytes());
            GuardedFrame both = source;
            ASSERT_TRUE(Process(*effect, host, both, both, 2.0));  // the same frame number: replayed
            for (std::int32_t y = 0; y < shape.height; ++y) {
                for (std::int32_t x = 0; x < shape.width; ++x) {
                    ASSERT_EQ(both.WordAt(y, x), destination.WordAt(y, x)) << index << ' ' << y << ' ' << x;
                }
            }
        }
    }
}

TEST_F(Boundary, ReplaysAFrameOnlyWhenItIsRepeatedAtOnce) {
    Reference<IVideoEffect> effect = Effect(0);
    FakeHost host;
    ShakeFully(host);
    GuardedFrame source{Geometry{64, 64}};
    source.FillRandom(1);
    const auto render = [&](double seconds) {
        GuardedFrame destination{Geometry{64, 64}};
        EXPECT_TRUE(Process(*effect, host, source, destination, seconds));
        return destination.Bytes();
    };
    int differences = 0;
    for (int frame = 1; frame < 6; ++frame) {
        const auto first = render(frame / 30.0);
        EXPECT_EQ(render(frame / 30.0), first);
        EXPECT_EQ(render(frame / 30.0 + 0.001), first) << "the same frame number";
        render(20.0);
        if (render(frame / 30.0) != first) ++differences;
    }
    EXPECT_GT(differences, 0);
}

TEST_F(Boundary, ConvertsFramesBothWays) {
    auto processor = Reference<IFrameProcessor>::Adopt(m_library->CreateFrameProcessor());
    const std::uint8_t packed[] = {50, 100, 60, 200, 70, 110, 1, 2};  // three pixels
    GuardedFrame pixels{Geometry{5, 1, 1, 0}};
    FrameRecord source = {const_cast<std::uint8_t*>(packed), 3, 1, 8, 0, 0, 0};
    const FrameRecord destination = pixels.Record();
    ASSERT_TRUE(processor->ConvertYcbcrToBgra(&source, &destination, 77));
    // Luma 50, Cb 100, Cr 200: the shifts of 65536 worked out by hand.
    EXPECT_EQ(pixels.At(0, 0).red, 154);
    EXPECT_EQ(pixels.At(0, 0).green, 0);
    EXPECT_EQ(pixels.At(0, 0).blue, 0);
    EXPECT_EQ(pixels.At(0, 2).alpha, 77);
    EXPECT_EQ(pixels.At(0, 3).alpha, GuardedFrame::kGuard) << "only the smaller size is written";

    std::uint8_t back[8] = {9, 9, 9, 9, 9, 9, 9, 9};
    FrameRecord target = {back, 3, 1, 8, 0, 0, 0};
    ASSERT_TRUE(processor->ConvertBgraToYcbcr(&destination, &target, 0));
    EXPECT_EQ(back[6], 9) << "a lone last pixel has only its Y and Cb";
    EXPECT_EQ(back[7], 9);
    EXPECT_NE(back[5], 9);

    source.rowStep = 7;
    EXPECT_FALSE(processor->ConvertYcbcrToBgra(&source, &destination, 0)) << "two groups need 8 bytes";
    source.rowStep = 8;
    source.xOrigin = 4;
    EXPECT_FALSE(processor->ConvertYcbcrToBgra(&source, &destination, 0)) << "and two more before the region";
    EXPECT_FALSE(processor->ConvertYcbcrToBgra(nullptr, &destination, 0));
    EXPECT_FALSE(processor->ConvertBgraToYcbcr(&destination, nullptr, 0));
    EXPECT_FALSE(processor->Reserved3(&source, &destination, 1));
    EXPECT_FALSE(processor->Reserved4(&source, &destination, 1));
    EXPECT_FALSE(processor->Reserved5(&source, &destination, 1));
}

TEST_F(Boundary, DoesNotDependOnTheCallersFloatingPointState) {
    Reference<IVideoEffect> effect = Effect(1);
    FakeHost host;
    for (std::uint32_t i = 0; i < 7; ++i) host.SetNumber(i, 0.37f);
    GuardedFrame source{Geometry{40, 30}}, plain{Geometry{40, 30}}, hostile{Geometry{40, 30}};
    source.FillRandom(1);
    ASSERT_TRUE(Process(*effect, host, source, plain, 1.0));
    std::uint32_t vector = 0, after = 0;
    std::uint16_t x87 = 0;
    __asm__ __volatile__("stmxcsr %0\n\tfnstcw %1" : "=m"(vector), "=m"(x87));
    FakeHost::SetStrangeFloats();
    const bool done = Process(*effect, host, source, hostile, 1.0);
    std::uint16_t singleAfter = 0;
    __asm__ __volatile__("stmxcsr %0\n\tfnstcw %1" : "=m"(after), "=m"(singleAfter));
    __asm__ __volatile__("ldmxcsr %0\n\tfldcw %1" : : "m"(vector), "m"(x87));
    ASSERT_TRUE(done);
    EXPECT_EQ(after, FakeHost::kStrangeVectorControl);
    EXPECT_EQ(singleAfter, FakeHost::kStrangeX87Control);
    EXPECT_EQ(hostile.Bytes(), plain.Bytes());

    // Nor on what the host makes of it while it answers.
    host.leavesFloatsStrange = true;
    GuardedFrame careless{Geometry{40, 30}};
    ASSERT_TRUE(Process(*effect, host, source, careless, 1.0));
    __asm__ __volatile__("stmxcsr %0\n\tfnstcw %1" : "=m"(after), "=m"(singleAfter));
    EXPECT_EQ(after & ~0x3Fu, vector & ~0x3Fu);
    EXPECT_EQ(singleAfter, x87);
    EXPECT_EQ(careless.Bytes(), plain.Bytes());
}

#if defined(_WIN32)

// Calls a __stdcall function with the stack 4, 8 or 12 bytes off a multiple of 16.
std::uint32_t CallOffBy(std::uint32_t shift, void* function, const std::vector<std::uint32_t>& words) {
    std::uint32_t result = 0;
    const std::uint32_t* end = words.data() + words.size();
    std::uint32_t count = static_cast<std::uint32_t>(words.size());
    const std::uint32_t adjust = shift + 16 - 4 * count % 16;
    __asm__ __volatile__(
        "movl %%esp, %%edi\n\t"
        "andl $-16, %%esp\n\t"
        "subl %[adjust], %%esp\n\t"
        "1: testl %[count], %[count]\n\t"
        "jz 2f\n\t"
        "subl $4, %[end]\n\t"
        "pushl (%[end])\n\t"
        "decl %[count]\n\t"
        "jmp 1b\n\t"
        "2: call *%%eax\n\t"
        "movl %%edi, %%esp\n\t"
        : "=a"(result), [end] "+b"(end), [count] "+S"(count)
        : "a"(function), [adjust] "d"(adjust)
        : "ecx", "edi", "memory", "cc");
    return result;
}

std::uint32_t Word(const void* pointer) {
    return reinterpret_cast<std::uint32_t>(pointer);
}

TEST_F(Boundary, TakesAStackAlignedToFourBytes) {
    for (const std::uint32_t shift : {0u, 4u, 8u, 12u}) {
        for (std::uint32_t index = 0; index < 5; ++index) {
            Reference<IVideoEffect> effect = Effect(index);
            FakeHost host;
            for (std::uint32_t i = 0; i < 27; ++i) host.SetNumber(i, 0.6f);
            GuardedFrame source{Geometry{61, 40}}, destination{Geometry{61, 40}}, aligned{Geometry{61, 40}};
            source.FillRandom(1);
            ASSERT_TRUE(Process(*effect, host, source, aligned, 3.0));
            const FrameRecord in = source.Record(), out = destination.Record();
            const TimingRecord timing = {0, 0, 3.0};
            void** table = *reinterpret_cast<void***>(effect.Get());
            const std::uint32_t done = CallOffBy(
                shift, table[6], {Word(effect.Get()), Word(&host), Word(&in), 0, Word(&out), Word(&timing)});
            ASSERT_EQ(done & 0xFFu, 1u) << shift;
            ASSERT_EQ(destination.Bytes(), aligned.Bytes()) << shift << ' ' << index;
            ParamDescriptor descriptor = {};
            ASSERT_EQ(CallOffBy(shift, table[5], {Word(effect.Get()), 1, Word(&descriptor)}) & 0xFFu, 1u);
        }
    }
}

TEST(Growth, TenThousandRoundsTakeNoMemory) {
    LoadedLibrary dll;
    auto library = Reference<IEffectLibrary>::Adopt(dll.getEffectsLibrary());
    const auto round = [&library](std::uint32_t i) {
        auto effect = Reference<IVideoEffect>::Adopt(library->CreateEffect(i % 5));
        auto processor = Reference<IFrameProcessor>::Adopt(library->CreateFrameProcessor());
        auto saver = Reference<IPresetSaver>::Adopt(library->CreatePresetSaver());
        ParamDescriptor descriptor = {};
        effect->GetParamInfo(0, &descriptor);
    };
    const auto committed = [] {
        PROCESS_MEMORY_COUNTERS counters = {};
        GetProcessMemoryInfo(GetCurrentProcess(), &counters, sizeof counters);
        return counters.PagefileUsage;
    };
    for (std::uint32_t i = 0; i < 500; ++i) round(i);
    const auto before = committed();
    for (std::uint32_t i = 0; i < 10000; ++i) round(i);
    EXPECT_LT(committed(), before + 64 * 1024);
}

#endif

}  // namespace
}  // namespace velmora

// The library through its binary interface: the rules that reelcheck, a host for any library, cannot check.

#include <gtest/gtest.h>

#include <memory>

#include "api/reference.h"
#include "tests/common/fake_host.h"
#include "tests/common/guarded_frame.h"
#include "tests/common/library_under_test.h"

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

TEST_F(Boundary, EffectsDoNotKeepTheLibraryLoaded) {
    const Reference<IVideoEffect> effect = Effect(1);
    EXPECT_FALSE(m_dll.canUnload());
    m_library.Reset();
    EXPECT_TRUE(m_dll.canUnload());
    EXPECT_STREQ(effect->GetName(), "Film Look");
}

// The tables of an interface, called by slot as by a host built with another compiler.
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

// reelcheck checks that a frame repeated at once has the same bytes; here another frame in between draws other
// numbers.
TEST_F(Boundary, ReplaysAFrameOnlyWhenItIsRepeatedAtOnce) {
    const Reference<IVideoEffect> effect = Effect(0);
    FakeHost host;
    for (const std::uint32_t jitter : {0u, 1u}) host.SetNumber(jitter, 1.0f);
    GuardedFrame source{Geometry{64, 64}};
    source.FillRandom(1);
    const auto render = [&](double seconds) {
        GuardedFrame destination{Geometry{64, 64}};
        const FrameRecord in = source.Record(), out = destination.Record();
        const TimingRecord timing = {-1.0, -1.0, seconds};
        EXPECT_TRUE(effect->Process(&host, &in, nullptr, &out, &timing));
        return destination.Bytes();
    };
    int differences = 0;
    for (int frame = 1; frame < 6; ++frame) {
        const auto first = render(frame / 30.0);
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
    // Luma 50, Cb 100, Cr 200: worked out by hand with the coefficients scaled by 65536.
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
}

}  // namespace
}  // namespace velmora

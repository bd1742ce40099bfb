// The effect objects between the host and the renderer: identity, counts and forwarding.

#include "effects/film_effect.h"

#include <gtest/gtest.h>

#include <limits>
#include <vector>

#include "tests/effects/test_hosts.h"

namespace velmora::tests {
namespace {

using effects::CreateEffectByIndex;

// An effect with its host interface, released at the end.
class Effect {
  public:
    explicit Effect(std::uint32_t index) : m_effect(CreateEffectByIndex(index)) {
        void* found = nullptr;
        if (m_effect->QueryInterface(&kIidVideoHost, &found) == kStatusOk) {
            m_asHost = static_cast<IVideoHost*>(found);
            m_asHost->Release();
        }
    }
    ~Effect() { m_effect->Release(); }
    Effect(const Effect&) = delete;
    Effect& operator=(const Effect&) = delete;

    IVideoEffect* operator->() const { return m_effect; }
    IVideoHost* AsHost() const { return m_asHost; }
    // Without frames there is nothing to render, but the host is attached.
    void Attach(IVideoHost* host) {
        EXPECT_FALSE(m_effect->Process(host, nullptr, nullptr, nullptr, nullptr));
    }

  private:
    IVideoEffect* m_effect;
    IVideoHost* m_asHost = nullptr;
};

constexpr ValueCell kUntouchedCell = {{.bits = 0xCCCCCCCCu}, 0xCCCCCCCCu, 0xCCCCCCCCu};

// reelcheck checks the effect's own answers; the host interface of the same object must give the same ones.
TEST(FilmEffect, AnswersToItsThreeIdentifiersFromItsHostFaceToo) {
    Effect effect(2);
    struct {
        const Guid* iid;
        void* pointer;
    } const rows[] = {{&kIidUnknown, effect.operator->()},
                      {&kIidVideoEffect, effect.operator->()},
                      {&kIidVideoHost, effect.AsHost()},
                      {&kIidPresetSaver, nullptr}};
    for (const auto& row : rows) {
        void* out = &effect;
        EXPECT_EQ(effect.AsHost()->QueryInterface(row.iid, &out),
                  row.pointer != nullptr ? kStatusOk : kStatusNoInterface);
        EXPECT_EQ(out, row.pointer);
        if (row.pointer != nullptr) effect->Release();
    }
    EXPECT_EQ(effect.AsHost()->QueryInterface(&kIidUnknown, nullptr), kStatusFailure);
}

TEST(FilmEffect, PassesUnknownIdentifiersToTheAttachedHost) {
    Effect effect(3);
    TestHost host;
    effect.Attach(&host);
    void* out = nullptr;
    EXPECT_EQ(effect->QueryInterface(&kIidPresetSaver, &out), kStatusOk);
    EXPECT_EQ(out, &host);
    EXPECT_EQ(host.references, 2u);
    out = &host;
    EXPECT_EQ(effect.AsHost()->QueryInterface(&kIidEffectLibrary, &out), kStatusNoInterface);
    EXPECT_EQ(host.outAsPassed, &host);  // arguments are passed on unchanged
    EXPECT_EQ(out, nullptr);
    EXPECT_EQ(effect->QueryInterface(&kIidPresetSaver, nullptr), kStatusFailure);
    // Its own interfaces come first, without counting a reference on the host.
    EXPECT_EQ(effect->QueryInterface(&kIidVideoHost, &out), kStatusOk);
    EXPECT_EQ(out, effect.AsHost());
    effect->Release();
    EXPECT_EQ(host.references, 2u);
}

TEST(FilmEffect, BothFacesShareOneCount) {
    IVideoEffect* effect = CreateEffectByIndex(0);
    void* out = nullptr;
    ASSERT_EQ(effect->QueryInterface(&kIidVideoHost, &out), kStatusOk);
    IVideoHost* found = static_cast<IVideoHost*>(out);
    EXPECT_EQ(effect->AddRef(), 3u);
    EXPECT_EQ(found->AddRef(), 4u);
    EXPECT_EQ(effect->Release(), 3u);
    EXPECT_EQ(effect->Release(), 2u);
    EXPECT_EQ(effect->Release(), 1u);
    EXPECT_EQ(found->Release(), 0u);
}

// Hosts never see the layout, but an effect must store no more than its five members.
TEST(FilmEffect, StoresItsFiveMembersOnly) {
    constexpr std::size_t kPointer = sizeof(void*);
    const std::size_t renderer = sizeof(CRsVelmoraEffect);
    EXPECT_LE(sizeof(effects::CFilmLook), 2 * kPointer + renderer + kPointer + kPointer);
    EXPECT_EQ(sizeof(effects::CFilmLook), sizeof(effects::CFilmProjector));
}

TEST(FilmEffect, AnswersNothingWithoutAHost) {
    for (std::uint32_t i = 0; i < 5; ++i) {
        Effect effect(i);
        for (int round = 0; round < 2; ++round) {
            for (std::uint32_t index = 0; index <= 21; ++index) {
                ValueCell cell = kUntouchedCell;
                EXPECT_FALSE(effect.AsHost()->GetParamValue(index, &cell, 2));
                EXPECT_EQ(cell.value.bits, kUntouchedCell.value.bits);
                EXPECT_EQ(cell.kind, kUntouchedCell.kind);
            }
            EXPECT_FALSE(effect.AsHost()->HostOperation4(1, 2, 3));
            EXPECT_EQ(effect.AsHost()->HostOperation5(1, 2), 0u);
            effect.Attach(nullptr);
        }
    }
}

TEST(FilmEffect, ForwardsTwoOperationsToTheHost) {
    Effect effect(1);
    TestHost host;
    effect.Attach(&host);
    EXPECT_TRUE(effect.AsHost()->HostOperation4(11, 12, 13));
    EXPECT_EQ(host.arguments, (std::vector<std::intptr_t>{11, 12, 13}));
    EXPECT_EQ(effect.AsHost()->HostOperation5(21, 22), 0x12345678u);
    EXPECT_EQ(host.arguments, (std::vector<std::intptr_t>{21, 22}));
    EXPECT_FALSE(effect.AsHost()->HostOperation6(31, 32));
    effect.AsHost()->HostOperation7(41, 42);
    EXPECT_EQ(host.arguments, (std::vector<std::intptr_t>{21, 22}));
}

TEST(FilmEffect, FailsPastTheLastSettingAndWithoutACell) {
    Effect effect(4);
    RecordingHost host;
    effect.Attach(&host);
    for (const std::uint32_t index : {21u, 0xFFFFFFFFu}) {
        ValueCell cell = kUntouchedCell;
        EXPECT_FALSE(effect.AsHost()->GetParamValue(index, &cell, 2));
        EXPECT_EQ(cell.value.bits, kUntouchedCell.value.bits);
        EXPECT_EQ(cell.kind, 2u);
    }
    EXPECT_FALSE(effect.AsHost()->GetParamValue(0, nullptr, 2));
    EXPECT_TRUE(host.calls.empty());
    host.answers = false;
    ValueCell cell = kUntouchedCell;
    EXPECT_FALSE(effect.AsHost()->GetParamValue(0, &cell, 2));
}

// "Film Express" has one slider for the amount of scratches and derives their depth: 1 - (1 - s)^2.
TEST(FilmEffect, DerivesTheDepthOfScratches) {
    class AmountHost final : public TestHost {
      public:
        bool VM_CALL GetParamValue(std::uint32_t, ValueCell* cell, std::uint32_t) override {
            if (answers) cell->value.number = amount;
            return answers;
        }
        float amount = 0.0f;
        bool answers = true;
    };
    constexpr float kNan = std::numeric_limits<float>::quiet_NaN();
    constexpr float kInfinity = std::numeric_limits<float>::infinity();
    struct {
        float amount, depth;
    } const rows[] = {{0.0f, 0.0f},  {0.25f, 0.4375f}, {0.5f, 0.75f}, {0.75f, 0.9375f},  {1.0f, 1.0f},
                      {-3.0f, 0.0f}, {7.0f, 1.0f},     {kNan, 0.0f},  {kInfinity, 1.0f}, {-kInfinity, 0.0f}};
    Effect effect(3);
    AmountHost host;
    effect.Attach(&host);
    for (const auto& row : rows) {
        host.amount = row.amount;
        ValueCell cell = {};
        EXPECT_TRUE(effect.AsHost()->GetParamValue(17, &cell, 2));
        EXPECT_EQ(cell.value.number, row.depth) << "amount " << row.amount;
    }
    // 0.2 is not exact in binary: 1 - s is rounded to single precision before it is squared.
    host.amount = 0.2f;
    ValueCell cell = {};
    EXPECT_TRUE(effect.AsHost()->GetParamValue(17, &cell, 2));
    EXPECT_EQ(cell.value.number,
              static_cast<float>(1.0L - 0.800000011920928955078125L * 0.800000011920928955078125L));

    host.answers = false;
    cell.value.number = 0.5f;
    EXPECT_TRUE(effect.AsHost()->GetParamValue(17, &cell, 2));
    EXPECT_EQ(cell.value.number, 0.75f);
}

}  // namespace
}  // namespace velmora::tests

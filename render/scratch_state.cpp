#include "render/scratch_state.h"

#include <algorithm>
#include <bit>
#include <utility>

#include "render/random.h"
#include "render/rounding.h"

namespace velmora::render {
namespace {

constexpr std::int32_t kLeastLife = static_cast<std::int32_t>(kFramesPerSecond / 2);
constexpr std::int32_t kMostLife = static_cast<std::int32_t>(kFramesPerSecond * 3);
constexpr std::int32_t kWhiteAbove = 700;     // of 1000, if both kinds are possible
constexpr std::uint32_t kDrawsAfterLife = 3;  // column, wander, speed

const ScratchProfile& ProfileOf(bool isWhite, std::int32_t index) noexcept {
    return (isWhite ? kWhiteScratchProfiles : kBlackScratchProfiles)[index];
}

void Move(ScratchState& scratch, std::int32_t frames) noexcept {
    for (; frames > 0; --frames) {
        const std::int64_t moved = scratch.position + scratch.speed;
        if (moved < scratch.leastPosition || moved > scratch.mostPosition) {
            scratch.speed = -scratch.speed;
        } else {
            scratch.position = moved;
        }
    }
}

}  // namespace

ScratchReplayKey ReplayKeyOf(const StageSettings& settings) noexcept {
    const std::uint32_t either = settings.scratchKinds & (kScratchBlack | kScratchWhite);
    const Arrangement arrangement = settings.arrangement.value_or(OwnArrangement(settings));
    return {SeedFor(std::bit_cast<std::uint32_t>(arrangement.scratchSeed), settings.hostSeed),
            std::min(std::max(settings.scratchCount, arrangement.scratchLives), kMostScratches),
            either != kScratchBlack && either != kScratchWhite};
}

void ScratchReplay::Start(const ScratchReplayKey& key) noexcept {
    m_key = key;
    m_numbers = Random(key.seed);
    m_frame = -1;
    m_endings.fill(0);
    m_endings[0] = static_cast<std::uint16_t>((1u << key.count) - 1u);
}

void ScratchReplay::AdvanceTo(std::int32_t frame) noexcept {
    while (m_frame < frame) {
        ++m_frame;
        unsigned ending =
            std::exchange(m_endings[static_cast<std::size_t>(m_frame % kRingFrames)], std::uint16_t{0});
        for (; ending != 0; ending &= ending - 1u)
            Restart(static_cast<std::uint32_t>(std::countr_zero(ending)));
    }
}

void ScratchReplay::Restart(std::uint32_t scratch) noexcept {
    Life& life = m_lives[scratch];
    life.numbers = m_numbers;
    life.firstFrame = m_frame;
    m_numbers.Next();  // the profile
    if (m_key.drawsKind) m_numbers.Next();
    life.endFrame = m_frame + m_numbers.Draw(kLeastLife, kMostLife);
    m_numbers.Skip(kDrawsAfterLife);
    m_endings[static_cast<std::size_t>(life.endFrame % kRingFrames)] |=
        static_cast<std::uint16_t>(1u << scratch);
}

const ScratchReplay& ScratchReplays::At(const ScratchReplayKey& key, std::int32_t frame) noexcept {
    std::size_t best = m_replays.size();
    std::size_t oldest = 0;
    for (std::size_t i = 0; i < m_replays.size(); ++i) {
        const ScratchReplay& replay = m_replays[i];
        if (m_uses - m_lastUse[i] > m_uses - m_lastUse[oldest]) oldest = i;
        if (replay.Key() != key || replay.Frame() > frame) continue;
        if (best == m_replays.size() || replay.Frame() > m_replays[best].Frame()) best = i;
    }
    // A replay that has not started has the empty key and no lives, so it is valid for that key.
    if (best == m_replays.size()) m_replays[best = oldest].Start(key);
    m_lastUse[best] = ++m_uses;
    m_replays[best].AdvanceTo(frame);
    return m_replays[best];
}

ScratchState ScratchStateAt(const ScratchReplay::Life& life, std::int32_t frame,
                            const StageSettings& settings, std::int32_t width) noexcept {
    Random numbers = life.numbers;
    ScratchState scratch;
    scratch.look = MixBits(numbers.State() + static_cast<std::uint32_t>(life.firstFrame));
    const bool mayBeThick = (settings.scratchKinds & kScratchThick) != 0;
    scratch.profileIndex = numbers.Draw(0, (mayBeThick ? kScratchProfiles : kThinScratchProfiles) - 1);
    scratch.isWhite = ReplayKeyOf(settings).drawsKind ? numbers.Draw(0, 1000) > kWhiteAbove
                                                      : (settings.scratchKinds & kScratchWhite) != 0;
    const ScratchProfile& profile = ProfileOf(scratch.isWhite, scratch.profileIndex);
    scratch.opacity = profile.opacity;
    scratch.width = profile.width;
    scratch.firstFrame = life.firstFrame;
    scratch.endFrame = life.firstFrame + numbers.Draw(kLeastLife, kMostLife);

    // In a picture narrower than the scratch, only columns from which it still covers the picture are allowed.
    const auto [leftmost, rightmost] = std::minmax({0, width - scratch.width});
    scratch.startColumn = numbers.Draw(leftmost, rightmost);
    scratch.wander = numbers.Draw(0, settings.scratchConstant);
    const std::int64_t left = std::int64_t{scratch.startColumn} - scratch.wander / 2;
    const std::int64_t right = std::int64_t{scratch.startColumn} + scratch.wander;
    scratch.leastPosition = std::clamp<std::int64_t>(left, leftmost, rightmost) * 1000;
    scratch.mostPosition = std::clamp<std::int64_t>(right, leftmost, rightmost) * 1000;
    scratch.position = std::int64_t{scratch.startColumn} * 1000;

    const float fastest = Narrow(settings.scratchConstant / 20.0);
    scratch.speed = RoundHalfAway(numbers.DrawDecimal(-fastest, fastest, 3) * 1000.0);
    Move(scratch, frame - life.firstFrame);

    const std::uint32_t mixed = MixBits(scratch.look ^ static_cast<std::uint32_t>(frame));
    scratch.tremble = 256 - 15 + static_cast<std::int32_t>(mixed % 31u);
    return scratch;
}

}  // namespace velmora::render

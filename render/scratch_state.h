// The lives of the scratches: where each one is in a frame. This depends on the settings and the frame number only.
//
// A frame shows the result of a replay from frame 0. In the replay every scratch starts in frame 0 and restarts in
// the frame in which its life ends. All scratches, in order of their index, draw from one generator started with the
// scratch seed. A past life affects later ones only through the number of its draws, so a replay steps from restart
// to restart and draws in full only the lives that the frame shows.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "render/random.h"
#include "render/stage_settings.h"

namespace velmora::render {

inline constexpr std::uint32_t kMostScratches = 16;
inline constexpr int kThinScratchProfiles = 3;
inline constexpr int kScratchProfiles = 5;

struct ScratchProfile {
    std::int32_t opacity;  // of the core, 0..256
    std::int32_t width;    // pixels
};

// The first three entries are thin, the last two thick. The upper end of a range is hardly ever drawn, so in practice
// only the first two appear, or the first four with thick scratches.
inline constexpr ScratchProfile kBlackScratchProfiles[kScratchProfiles] = {
    {205, 2}, {235, 3}, {250, 4}, {235, 7}, {250, 10},
};
inline constexpr ScratchProfile kWhiteScratchProfiles[kScratchProfiles] = {
    {195, 2}, {225, 3}, {245, 4}, {230, 6}, {245, 9},
};

// One scratch in one frame. Columns are those of the scratch's left edge, counted from the left edge of the processed
// rectangle. Positions and speed are in thousandths of a pixel, which makes the movement exact.
struct ScratchState {
    bool isWhite = false;
    std::int32_t profileIndex = 0;
    std::int32_t opacity = 0;     // of the profile, 0..256
    std::int32_t width = 0;       // of the profile, pixels
    std::int32_t firstFrame = 0;  // of this life
    std::int32_t endFrame = 0;    // the first frame that no longer belongs to it
    std::int32_t startColumn = 0;
    std::int32_t wander = 0;  // how far it may move: half of this to the left, all of it to the right
    std::int64_t leastPosition = 0;
    std::int64_t mostPosition = 0;
    std::int64_t position = 0;
    std::int32_t speed = 0;    // per frame
    std::uint32_t look = 0;    // seeds strength, waver and breaks of this life
    std::int32_t tremble = 0;  // of the strength in this frame, 241..271 of 256
};

// The values that the draws of all lives depend on.
struct ScratchReplayKey {
    std::uint32_t seed = 0;
    std::uint32_t count = 0;
    bool drawsKind = false;  // both kinds are possible, which takes one more draw per life

    bool operator==(const ScratchReplayKey&) const = default;
};
[[nodiscard]] ScratchReplayKey ReplayKeyOf(const StageSettings& settings) noexcept;

// A replay that has reached some frame and can continue from there.
class ScratchReplay {
  public:
    struct Life {
        Random numbers;  // before the draws of this life
        std::int32_t firstFrame = 0;
        std::int32_t endFrame = 0;
    };

    void Start(const ScratchReplayKey& key) noexcept;
    // Advances to `frame`, which must not be before Frame(). Takes about 5 ms for ten hours of frames.
    void AdvanceTo(std::int32_t frame) noexcept;

    [[nodiscard]] const ScratchReplayKey& Key() const noexcept { return m_key; }
    [[nodiscard]] std::int32_t Frame() const noexcept { return m_frame; }  // -1: before the first
    [[nodiscard]] const Life& LifeOf(std::uint32_t scratch) const noexcept { return m_lives[scratch]; }

  private:
    static constexpr std::int32_t kRingFrames = 128;  // more than the longest life

    void Restart(std::uint32_t scratch) noexcept;

    ScratchReplayKey m_key;
    Random m_numbers;
    std::int32_t m_frame = -1;
    std::array<Life, kMostScratches> m_lives;
    std::array<std::uint16_t, kRingFrames> m_endings{};  // by frame modulo ring: a bit for each scratch
};

// A few replays, so that a frame can continue from an earlier one even if clips with different settings alternate or
// a host jumps back and forth. Results never depend on what is cached here.
class ScratchReplays {
  public:
    [[nodiscard]] const ScratchReplay& At(const ScratchReplayKey& key, std::int32_t frame) noexcept;

  private:
    std::array<ScratchReplay, 4> m_replays;
    std::array<std::uint32_t, 4> m_lastUse{};
    std::uint32_t m_uses = 0;
};

// The frame whose scratches `frameNumber` shows: 0 before the clip starts. After 2^22 frames (38 hours) they repeat
// from the start, which bounds the time of a replay.
[[nodiscard]] constexpr std::int32_t ScratchFrame(std::int32_t frameNumber) noexcept {
    return frameNumber < 0 ? 0 : frameNumber & 0x3FFFFF;
}

// The state of a life in `frame`, which must be within the life, in a picture `width` pixels wide.
[[nodiscard]] ScratchState ScratchStateAt(const ScratchReplay::Life& life, std::int32_t frame,
                                          const StageSettings& settings, std::int32_t width) noexcept;

// The cross-sections of scratches are weights of whole pixels.

inline constexpr std::int32_t kScratchPhases = 32;  // positions of a scratch's left edge within a pixel
inline constexpr std::int32_t kMostScratchPixels = 12;
inline constexpr std::int32_t kScratchSections = 3;  // kinds of cross-section, for scratches of each width

// For a left edge `phase` steps into a pixel: the share of that pixel and of those to its right that the scratch
// covers, 0..65280 (65536 would be all).
using ScratchShape = std::array<std::array<std::uint16_t, kMostScratchPixels>, kScratchPhases>;

// Before a scratch breaks off it narrows until only its finest part is left.
struct ScratchShapes {
    std::int32_t pixels = 0;           // how many a scratch can touch, rounded up to whole vectors of four
    std::array<ScratchShape, 3> worn;  // whole, narrowed, and its finest part

    // Those of a shape of `worn` and a phase: `place` is the shape times kScratchPhases plus the phase.
    [[nodiscard]] const std::uint16_t* WeightsAt(std::size_t place) const noexcept {
        return worn[place / kScratchPhases][place % kScratchPhases].data();
    }
};

// The shapes of a profile, 0..kScratchProfiles − 1, with a section of 0..kScratchSections − 1.
[[nodiscard]] const ScratchShapes& ScratchShapesOf(bool isWhite, std::int32_t profile,
                                                   std::int32_t section) noexcept;

}  // namespace velmora::render

// The settings of all stages for one frame: plain values, read once per frame. With the defaults no stage does
// anything.
#pragma once

#include <cstdint>
#include <optional>

namespace velmora::render {

enum ScratchKinds : std::uint32_t { kScratchBlack = 1, kScratchWhite = 2, kScratchThick = 4 };
enum WearChannels : std::int32_t { kWearBlueOnly = 4, kWearAllChannels = 7 };

inline constexpr std::uint32_t kFramesPerSecond = 30;  // whatever the host's rate is

// The places of scratches and the rhythm of flicker follow from their settings. A host that changes these from frame to
// frame passes the same arrangement with all frames; otherwise each frame would have scratches and flicker of its own.
struct Arrangement {
    float scratchSeed = 0.0f;
    std::uint32_t scratchLives = 0;  // the most scratches that any frame shows
    float flickerSeed = 0.0f;
};

struct StageSettings {
    std::int32_t yJitter = 0;  // largest shift in pixels, 0..10
    std::int32_t xJitter = 0;
    std::uint32_t borderColour = 0xFF000000u;  // 0xAARRGGBB

    float glow = 0.0f;  // 0..1

    float saturation = 0.0f;        // -1 grey .. 0 unchanged .. 1
    float flicker = 0.0f;           // 0..1
    std::uint32_t flickerRate = 0;  // changes per second, 0..30
    float brightness = 0.0f;        // -1..1
    float contrast = 0.0f;          // -1..1

    float filmGamma = 0.0f;  // 0..1
    float tintRed = 0.5f;    // 0..1, 0.5: no tint
    float tintGreen = 0.5f;
    float tintBlue = 0.5f;

    float wear = 0.0f;                // 0..1
    std::int32_t wearPattern = 2000;  // menu value of the picture (render/pictures.h)
    std::int32_t wearChannels = kWearAllChannels;

    std::uint32_t scratchKinds = 0;    // ScratchKinds combined; 0: no scratches
    std::uint32_t scratchCount = 0;    // 0..16
    std::int32_t scratchConstant = 0;  // bounds range and speed of a scratch's sideways movement, pixels
    float scratchDepth = 0.0f;         // 0..1
    float scratchSeed = 0.0f;          // its bits seed the scratches' own generator, with hostSeed

    float spots = 0.0f;  // 0..100

    // Varies scratches and flicker, whose own seeds come from the values above. 0 if the host gives no seed.
    std::uint32_t hostSeed = 0;

    std::optional<Arrangement> arrangement = {};  // nothing: that of the settings
};

// The arrangement that the settings have by themselves.
[[nodiscard]] inline Arrangement OwnArrangement(const StageSettings& settings) noexcept {
    const double tone = double{settings.saturation} + settings.flicker;
    return {settings.scratchSeed, settings.scratchCount, static_cast<float>(tone)};
}

}  // namespace velmora::render

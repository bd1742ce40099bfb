// The settings of all stages for one frame: plain values, read once per frame. With the defaults no stage does
// anything.
#pragma once

#include <cstdint>

namespace velmora::render {

enum ScratchKinds : std::uint32_t { kScratchBlack = 1, kScratchWhite = 2, kScratchThick = 4 };
enum WearChannels : std::int32_t { kWearBlueOnly = 4, kWearAllChannels = 7 };

inline constexpr std::uint32_t kFramesPerSecond = 30;  // whatever the host's rate is

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
    std::int32_t wearPattern = 2000;  // menu value of the picture, 2000..2006
    std::int32_t wearChannels = kWearAllChannels;

    std::uint32_t scratchKinds = 0;    // ScratchKinds combined; 0: no scratches
    std::uint32_t scratchCount = 0;    // 0..16
    std::int32_t scratchConstant = 0;  // bounds range and speed of a scratch's sideways movement, pixels
    float scratchDepth = 0.0f;         // 0..1
    float scratchSeed = 0.0f;          // its bits seed the scratches' own generator, with hostSeed

    float spots = 0.0f;  // 0..100

    // Varies scratches and flicker, whose own seeds come from the values above. 0 if the host gives no seed.
    std::uint32_t hostSeed = 0;
};

}  // namespace velmora::render

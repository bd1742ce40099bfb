// `reelfx strip`: successive frames side by side at 100 %, for judging motion where nothing can be played.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <utility>

#include "text/number_text.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/commands/picture_commands.h"

namespace velmora::hosts {

// A part of a picture, in pixels.
struct Crop {
    FrameSize size;
    std::optional<std::pair<std::int32_t, std::int32_t>>
        corner;  // left, top; nothing: in the picture's middle
};

// "160x540+880+270", or "160x540".
std::optional<Crop> ParseCrop(const std::string& text);

struct StripOptions {
    PictureOptions picture;  // its width does not count; without a place, the frames of the clip's middle
    int frames = 12;         // fewer come where the clip ends
    // Nothing: the middle of the picture, so wide that a row of the frames is about as wide as a screen.
    std::optional<Crop> crop;
};

// Throws Failure or UsageError.
ExitCode RunStrip(const StripOptions& options);

}  // namespace velmora::hosts

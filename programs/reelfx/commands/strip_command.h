// `reelfx strip`: successive frames side by side at 100 %, for judging motion where no video can be played.
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
        corner;  // left, top; nothing: in the middle of the picture
};

// "160x540+880+270", or "160x540".
std::optional<Crop> ParseCrop(const std::string& text);

struct StripOptions {
    PictureOptions picture;  // its width is not used; without a place, the frames in the middle of the clip
    int frames = 12;         // fewer if the clip ends earlier
    // Nothing: the middle of the picture, wide enough for a row of frames to fill a screen.
    std::optional<Crop> crop;
};

// Throws Failure or UsageError.
ExitCode Run(const StripOptions& options);

}  // namespace velmora::hosts

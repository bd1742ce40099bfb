// `reelfx frame`: one frame before and after; `reelfx sheet`: one frame through all presets of an effect.
#pragma once

#include <cstdint>
#include <string>

#include "programs/reelfx/common/effect_choice.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/media_reader.h"

namespace velmora::hosts {

struct PictureOptions {
    InputOptions input;
    EffectOptions effect;
    std::string out;         // .png or .jpg
    std::int64_t frame = 0;  // of the clip
    std::int32_t width = 0;  // of each picture; 0: the command's own
    int columns = 4;         // of a sheet
    bool mayOverwrite = false;
};

// Throw Failure or UsageError.
ExitCode RunFrame(const PictureOptions& options);
ExitCode RunSheet(const PictureOptions& options);

}  // namespace velmora::hosts

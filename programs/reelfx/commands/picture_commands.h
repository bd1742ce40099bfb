// `reelfx frame`: one frame before and after; `reelfx sheet`: one frame through all presets of an effect, or of
// each effect.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "programs/reelfx/common/effect_choice.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/media_reader.h"
#include "programs/reelfx/pipeline/clip_pictures.h"

namespace velmora::hosts {

struct PictureOptions {
    InputOptions input;
    std::vector<EffectOptions> effects;  // in order, one at least; of a sheet, one
    std::string out;                     // .png or .jpg
    FramePlace place;                    // of the clip
    std::int32_t width = 0;              // of each picture; 0: the command's own
    int columns = 0;                     // pictures in a row; 0: the command's own
    bool mayOverwrite = false;
};

struct FrameOptions {
    PictureOptions picture;
};

// Settings and mix of the effect apply to each preset.
struct SheetOptions {
    PictureOptions picture;
    // Write a sheet for each effect: `out` is a folder, which is created if needed, or a name with "%s" for
    // the effect's name, such as "film-pro". Of the effect, only the randomness is used.
    bool allEffects = false;
};

// Throw Failure or UsageError.
ExitCode Run(const FrameOptions& command);
ExitCode Run(const SheetOptions& command);

}  // namespace velmora::hosts

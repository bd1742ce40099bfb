// `reelfx render`: a clip through one or several effects.
#pragma once

#include <optional>
#include <vector>

#include "programs/reelfx/pipeline/clip_section.h"
#include "programs/reelfx/common/effect_choice.h"
#include "programs/reelfx/conversion/picture_view.h"
#include "programs/reelfx/media/encoder_choice.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/media_reader.h"
#include "programs/reelfx/common/progress.h"

namespace velmora::hosts {

struct RenderOptions {
    InputOptions input;
    std::vector<EffectOptions> effects;  // in order, one at least
    SectionOptions section;
    std::optional<OutputOptions> output;  // none: digests only
    int threads = 0;                      // 0: one per processor
    bool mayOverwrite = false;
    bool withSound = true;
    bool withDigests = false;  // a line for each frame on standard output
    std::optional<SampleType> depth;  // that the effects work in; none: as SamplesFor says
    bool isMatte = false;      // only the damage, without the picture
    bool isDryRun = false;     // checks and reports, but writes nothing
    ProgressKind progress = ProgressKind::kAuto;
};

// Throws Failure or UsageError.
ExitCode Run(const RenderOptions& options);

}  // namespace velmora::hosts

// What `reelfx render --dry-run` tells: everything that a run would do.
#pragma once

#include <string>

#include "programs/reelfx/pipeline/clip_section.h"
#include "programs/reelfx/media/media_writer.h"
#include "programs/reelfx/commands/render_command.h"

namespace velmora::hosts {

// `section` is where the frames come from, a farm's part resolved. Lines of text, each with its end. `writer` null: digests only.
std::string PlanText(const RenderOptions& options, const SectionOptions& section, const EffectChoice& choice,
                     const MediaReader& reader, const MediaWriter* writer, unsigned threads);

}  // namespace velmora::hosts

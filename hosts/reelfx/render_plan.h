// What `reelfx render --dry-run` tells: everything that a run would do.
#pragma once

#include <string>

#include "hosts/reelfx/clip_section.h"
#include "hosts/reelfx/media_writer.h"
#include "hosts/reelfx/render_command.h"

namespace velmora::hosts {

// `section` is where the frames come from, a farm's part resolved. Lines of text, each with its end. `writer` null: digests only.
std::string PlanText(const RenderOptions& options, const SectionOptions& section, const EffectChoice& choice,
                     const MediaReader& reader, const MediaWriter* writer, unsigned threads);

}  // namespace velmora::hosts

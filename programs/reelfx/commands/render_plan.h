// What `reelfx render --dry-run` prints: everything that a run would do.
#pragma once

#include <string>

#include "programs/reelfx/pipeline/clip_section.h"
#include "programs/reelfx/pipeline/effect_list.h"
#include "programs/reelfx/media/media_writer.h"
#include "programs/reelfx/commands/render_command.h"

namespace velmora::hosts {

// What the effects work on.
SampleType SamplesOf(const RenderOptions& options, const MediaReader& reader);

// Returns lines of text with line ends. `section` has the farm part resolved. A null `writer` means digests
// only.
std::string PlanText(const RenderOptions& options, const SectionOptions& section, const EffectList& effects,
                     const MediaReader& reader, const MediaWriter* writer, unsigned threads);

}  // namespace velmora::hosts

// Frames of a clip as the viewer sees them, for the commands that write stills.
#pragma once

#include <cstdint>
#include <optional>

#include "programs/reelfx/media/bgra_picture.h"
#include "programs/reelfx/pipeline/clip_section.h"
#include "programs/reelfx/pipeline/effect_list.h"
#include "programs/reelfx/media/media_reader.h"

namespace velmora::hosts {

// Which frame of the clip comes first; at most one of the two is set.
struct FramePlace {
    std::optional<std::int64_t> frame = {};  // counted from 0
    std::optional<double> start = {};        // seconds: the first frame at or after this time
};

struct ClipPicture {
    BgraPicture picture;  // turned upright
    double seconds = 0.0;
    std::int64_t index = 0;  // in the clip, from 0
};

class ClipPictures {
  public:
    // Without a place: `count` frames from the middle of the clip, or from its start if it can be read only
    // once (standard input, a pipe). Throws Failure (kExitInput) as MediaReader does.
    ClipPictures(const InputOptions& input, const FramePlace& place, std::int64_t count);

    // The frames in order; nothing at the end of the clip. Throws Failure if there is no frame at all
    // (kExitInput) or the user interrupts.
    std::optional<ClipPicture> Next();

  private:
    [[noreturn]] void FailWithoutFrame() const;
    const SectionOptions& Resolved(const InputOptions& input);

    SectionOptions m_place;
    MediaReader m_reader;
    ClipSection m_section;
    bool m_hasBegun = false;
};

// Applies the effects to the picture. Throws Failure if the user interrupts, or with kExitInternal.
BgraPicture Rendered(EffectListSession& effects, ClipPicture& source);

}  // namespace velmora::hosts

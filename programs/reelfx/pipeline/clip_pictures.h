// Frames of a clip as pictures that a viewer sees, for the commands that write stills.
#pragma once

#include <cstdint>
#include <optional>

#include "effects/effect_session.h"
#include "programs/reelfx/media/bgra_picture.h"
#include "programs/reelfx/pipeline/clip_section.h"
#include "programs/reelfx/media/media_reader.h"

namespace velmora::hosts {

// Which frame of the clip comes first; at most one of the two is set.
struct FramePlace {
    std::optional<std::int64_t> frame = {};  // counted from 0
    std::optional<double> start = {};        // seconds: the first frame that is not earlier
};

struct ClipPicture {
    BgraPicture picture;  // turned upright
    double seconds = 0.0;
    std::int64_t index = 0;  // in the clip, from 0
};

class ClipPictures {
  public:
    // Without a place: `count` frames from the middle of the clip, or from its start where it can be read only once
    // (standard input, a pipe). Throws Failure (kExitInput) as MediaReader does.
    ClipPictures(const InputOptions& input, const FramePlace& place, std::int64_t count);

    // The frames one after the other; nothing at the clip's end. Throws Failure: there is not even the first one
    // (kExitInput), or the user interrupts.
    std::optional<ClipPicture> Next();

  private:
    [[noreturn]] void FailWithoutFrame() const;

    SectionOptions m_place;
    MediaReader m_reader;
    ClipSection m_section;
    bool m_hasBegun = false;
};

// The picture through the effect. Throws Failure: the user interrupts, or kExitInternal.
BgraPicture Rendered(effects::EffectSession& session, ClipPicture& source);

}  // namespace velmora::hosts

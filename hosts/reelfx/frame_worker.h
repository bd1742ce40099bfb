// What one thread does with a frame: to BGRA, upright, through the effect, and back.
#pragma once

#include <functional>
#include <memory>

#include "effects/effect_session.h"
#include "hosts/reelfx/bgra_picture.h"
#include "hosts/reelfx/frame_pipeline.h"
#include "hosts/reelfx/media_writer.h"
#include "hosts/reelfx/pixel_converter.h"

namespace velmora::hosts {

class FrameWorker {
  public:
    // `writer` null: no frames are wanted, only digests. `quarterTurns`: see QuarterTurnsOf.
    FrameWorker(std::unique_ptr<effects::EffectSession> session, const MediaWriter* writer, FrameSize size,
                int quarterTurns, bool withDigest);

    // Replaces the frame by its result and fills in the digest.
    void Work(PipelineItem& item);

  private:
    BgraPicture& Apply(double seconds);  // of m_source; the result, lying as the source does

    std::unique_ptr<effects::EffectSession> m_session;
    const MediaWriter* m_writer;
    int m_quarterTurns;
    bool m_withDigest;
    PixelConverter m_converter;
    BgraPicture m_source, m_result, m_upright;
};

}  // namespace velmora::hosts

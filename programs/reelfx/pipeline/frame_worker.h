// What one thread does with a frame: convert it to a picture, turn it upright, apply the effects, and convert it
// back.
#pragma once

#include <functional>

#include "programs/reelfx/media/bgra_picture.h"
#include "programs/reelfx/pipeline/effect_list.h"
#include "programs/reelfx/pipeline/frame_digests.h"
#include "programs/reelfx/pipeline/frame_pipeline.h"
#include "programs/reelfx/media/media_writer.h"
#include "programs/reelfx/media/pixel_converter.h"

namespace velmora::hosts {

class FrameWorker {
  public:
    struct Job {
        const MediaWriter* writer = nullptr;      // null: only digests are wanted
        FrameSize size = {};                      // of the source's frames
        PictureTurn turn = {};                    // which makes the picture upright
        FrameDigests* digests = nullptr;          // of the pipeline, if they are wanted
        SampleType samples = SampleType::kBytes;  // that the effects work on
        bool isMatte = false;                     // the result is only the damage, see pictures.h
    };
    FrameWorker(EffectListSession session, const Job& job);

    // Replaces the frame by its result, or without a writer drops it.
    void Work(PipelineItem& item);

  private:
    BgraPicture& Result(PipelineItem& item);
    void Replace(PipelineItem& item, const BgraPicture& result);
    // The result for m_source, turned as the output is.
    BgraPicture& Apply(const PipelineItem& item);
    [[nodiscard]] bool StaysUpright() const;
    // Turned as the source is: digests do not depend on the output.
    BgraPicture& AsStored(BgraPicture& result);

    EffectListSession m_effects;
    Job m_job;
    PixelConverter m_converter;
    BgraPicture m_source, m_result, m_upright;
};

}  // namespace velmora::hosts

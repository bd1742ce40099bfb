// The encoder of the output's picture: set up for the source's size, shape, colours, rate and rotation, as far as the
// container can hold them.
#pragma once

#include <string>
#include <vector>

#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/encoder_choice.h"
#include "programs/reelfx/media/media_reader.h"

namespace velmora::hosts {

class PictureEncoder {
  public:
    // Throws Failure: kExitUsage for unsuitable options, otherwise kExitOutput. `source` must outlive the encoder.
    // `name` is that of the output, for messages.
    PictureEncoder(const OutputOptions& options, const AVOutputFormat& container, const MediaReader& source,
                   const std::string& name);

    ~PictureEncoder();
    PictureEncoder(const PictureEncoder&) = delete;
    PictureEncoder& operator=(const PictureEncoder&) = delete;

    [[nodiscard]] AVCodecContext& Context() const { return *m_encoder; }
    // Describes the encoded picture in a stream of the output.
    void Describe(AVStream& stream) const;

    // True if the pixels are those of the upright picture, without a tag.
    [[nodiscard]] bool IsUpright() const { return m_isUpright; }
    // True if frames follow at Context().framerate, one tick each.
    [[nodiscard]] bool HasConstantRate() const { return m_hasConstantRate; }

    // A frame with planes of its own for the pixels of `source`'s result. Safe to call from many threads.
    [[nodiscard]] FramePtr NewResult(const AVFrame& source) const;
    // True when the encoder accepts the source's own samples.
    [[nodiscard]] bool TakesAsItIs(const AVFrame& source) const;

    // What is changed on purpose or left out, a phrase each.
    [[nodiscard]] const std::vector<std::string>& Notes() const { return m_notes; }

  private:
    [[nodiscard]] PictureSource SourceOf(const AVOutputFormat& container) const;
    void ChooseTurn(const OutputOptions& options, const AVOutputFormat& container);
    void SetUp(const OutputOptions& options, const AVOutputFormat& container, const AVCodec& codec);
    void SetRate(const OutputOptions& options, const AVOutputFormat& container, const AVCodec& codec);
    void DescribeColours(const AVOutputFormat& container);
    void NoteLosses(const AVOutputFormat& container);

    const MediaReader& m_source;
    CodecPtr m_encoder;
    BufferPoolPtr m_buffers;  // of results
    bool m_isUpright = false;
    bool m_hasConstantRate = false;
    bool m_isMovFamily = false;
    std::vector<std::string> m_notes;
};

}  // namespace velmora::hosts

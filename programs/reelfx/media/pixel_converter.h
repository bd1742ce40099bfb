// Converts decoded frames to pictures and back. Both ways use the frame's own matrix, range and chroma position, so
// that an unchanged picture comes back as it was. Frames in linear light become display values, and back
// (conversion/picture_view.h). One converter per thread.
//
// Frames of YCbCr, grey and deep RGB go through conversion/, which rounds once. The library's scaler does the rest:
// 8-bit RGB, where both are exact and it is faster, frames of another size than the picture, palettes and other rare
// formats.
#pragma once

#include <optional>

#include "programs/reelfx/conversion/frame_coding.h"
#include "programs/reelfx/conversion/frame_to_picture.h"
#include "programs/reelfx/conversion/picture_to_frame.h"
#include "programs/reelfx/conversion/picture_view.h"
#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::hosts {

class PixelConverter {
  public:
    // Fills the picture, whose size and type of samples stay: a frame of another size is scaled. Alpha is the
    // frame's, or opaque. Throws Failure (kExitInput) for a format that cannot be converted.
    void ToPicture(const AVFrame& frame, const PictureView& picture);

    // Fills the frame's planes; its size, format, range, matrix and chroma position are set by the caller.
    void FromPicture(const ConstPictureView& picture, AVFrame& frame);

    void ToBgra(const AVFrame& frame, BgraPicture& picture) {
        ToPicture(frame,
                  {picture.Row(0), picture.Stride(), picture.Width(), picture.Height(), SampleType::kBytes});
    }
    void FromBgra(const BgraPicture& picture, AVFrame& frame) {
        FromPicture({picture.Row(0), picture.Stride(), picture.Width(), picture.Height(), SampleType::kBytes},
                    frame);
    }

  private:
    void CodesToPicture(const AVFrame& frame, const PictureView& picture);
    void CodesFromPicture(const ConstPictureView& picture, AVFrame& frame);

    template <class Conversion>
    struct Prepared {
        FrameCoding coding{};
        SampleType samples{};
        std::optional<Conversion> conversion;
    };
    struct Scaler {
        FrameCoding from{}, to{};
        ScalerPtr context;
    };
    static void Prepare(Scaler& scaler, const FrameCoding& from, const FrameCoding& to);
    void ScaleToPicture(const AVFrame& frame, const PictureView& picture);
    void ScaleFromPicture(const ConstPictureView& picture, AVFrame& frame);

    Prepared<FrameToPicture> m_toPicture;
    Prepared<PictureToFrame> m_fromPicture;
    Scaler m_toScaler, m_fromScaler;
    BgraPicture m_light;
    std::vector<std::uint16_t> m_words;  // a picture between floats and the scaler
};

}  // namespace velmora::hosts

// Converts decoded frames to BGRA and back. Both ways use the frame's own matrix, range and chroma position,
// so that an unchanged picture comes back as it was. One converter per thread.
#pragma once

#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::hosts {

// If a stream has no matrix tag, players assume BT.709 for high definition and BT.601 below.
AVColorSpace EffectiveMatrix(AVColorSpace space, int width, int height);

bool IsRgb(AVPixelFormat format);

class PixelConverter {
  public:
    // Fills `picture` and keeps its size: a frame of another size is scaled.
    void ToBgra(const AVFrame& frame, BgraPicture& picture);

    // Fills the frame's planes; its size, format, range, matrix and chroma position are set by the caller.
    void FromBgra(const BgraPicture& picture, AVFrame& frame);

  private:
    // One side of a conversion.
    struct Side {
        int width, height;
        AVPixelFormat format;
        AVColorSpace space;
        AVColorRange range;
        AVChromaLocation chroma;
        bool operator==(const Side&) const = default;
    };
    struct Scaler {
        Side from{}, to{};
        ScalerPtr context;
    };
    static Side SideOf(const AVFrame& frame);
    static Side SideOf(const BgraPicture& picture);
    static void Prepare(Scaler& scaler, const Side& from, const Side& to);

    Scaler m_toBgra, m_fromBgra;
};

}  // namespace velmora::hosts

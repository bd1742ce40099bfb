// Converts a picture to a frame: the colours are computed in floats, chroma is reduced first across, then down, and
// every sample is rounded once. One per thread.
#pragma once

#include <array>
#include <vector>

#include "programs/reelfx/conversion/picture_view.h"
#include "programs/reelfx/conversion/sample_rows.h"

namespace velmora::hosts {

class PictureToFrame {
  public:
    // `layout` is that of the coding's format.
    PictureToFrame(SampleType samples, const FrameCoding& coding, const SampleLayout& layout,
                   const RowKernels& kernels);

    // The frame has the coding, and the picture has its size.
    void Convert(const ConstPictureView& picture, AVFrame& frame);

  private:
    struct ChromaRows {
        FloatRow full;
        std::vector<FloatRow> phases;  // every second (or fourth) sample of it
        std::vector<FloatRow> across;  // the row of a picture's row lies at its number modulo their count
    };

    void SetMatrix(SampleType samples, const CodeMatrix& codes);
    void ReduceAcross(ChromaRows& chroma, float* out);
    void WriteChroma(int y, int height, AVFrame& frame);

    SampleLayout m_layout;
    const RowKernels& m_kernels;
    RowKernels::FromPixels m_fromPixels;
    RowMatrix m_matrix = {};
    std::array<float, 3> m_zero = {};
    int m_width, m_chromaWidth;
    FilterTaps m_acrossTaps, m_downTaps;
    FloatRow m_luma, m_alpha;
    std::array<ChromaRows, 2> m_chroma;
    int m_chromaY = 0;  // the next row of chroma
};

}  // namespace velmora::hosts

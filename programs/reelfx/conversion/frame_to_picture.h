// Converts a frame to a picture: chroma is interpolated to the size of luma, first down, then across, and the
// colours are computed in floats, rounded once. One per thread.
#pragma once

#include <array>
#include <vector>

#include "programs/reelfx/conversion/picture_view.h"
#include "programs/reelfx/conversion/sample_rows.h"

namespace velmora::hosts {

class FrameToPicture {
  public:
    // `layout` is that of the coding's format.
    FrameToPicture(const FrameCoding& coding, const SampleLayout& layout, SampleType samples,
                   const RowKernels& kernels);

    // The frame has the coding, and the picture has its size.
    void Convert(const AVFrame& frame, const PictureView& picture);

  private:
    struct ChromaRows {
        std::vector<FloatRow> read;  // a row of the plane lies at its number modulo their count
        std::vector<int> numbers;    // of the rows
        FloatRow down;
        std::vector<FloatRow> phases;
        FloatRow across;
    };

    void SetMatrix(const FrameCoding& coding, SampleType samples);
    const float* ChromaRow(const AVFrame& frame, std::size_t component, int y);
    const FloatRow& ReadChroma(const AVFrame& frame, std::size_t component, int y);
    const float* Across(ChromaRows& chroma, const FloatRow& row);

    SampleLayout m_layout;
    const RowKernels& m_kernels;
    RowKernels::ToPixels m_toPixels;
    RowMatrix m_matrix = {};
    int m_width, m_chromaWidth, m_chromaHeight;
    std::vector<FilterTaps> m_downTaps, m_acrossTaps;
    FloatRow m_luma, m_alpha;
    std::array<ChromaRows, 2> m_chroma;
};

}  // namespace velmora::hosts

#include "programs/reelfx/conversion/picture_to_frame.h"

#include <algorithm>

namespace velmora::hosts {
namespace {

// Both for negative numbers too.
int FloorOf(int number, int shift) {
    return number >> shift;
}
std::size_t RestOf(int number, int shift) {
    return static_cast<std::size_t>(number & ((1 << shift) - 1));
}

}  // namespace

PictureToFrame::PictureToFrame(SampleType samples, const FrameCoding& coding, const SampleLayout& layout,
                               const RowKernels& kernels)
    : m_layout(layout),
      m_kernels(kernels),
      m_fromPixels(samples == SampleType::kBytes   ? kernels.fromBytes
                   : samples == SampleType::kWords ? kernels.fromWords
                                                   : kernels.fromFloats),
      m_width(coding.width),
      m_chromaWidth(ChromaSize(coding.width, layout.chromaWidthShift)),
      m_luma(coding.width),
      m_alpha(coding.width) {
    SetMatrix(samples, MatrixOf(coding, layout));
    const ChromaPosition position = ChromaPositionOf(coding, layout);
    m_acrossTaps = ReducingTaps(1 << layout.chromaWidthShift, position.x);
    m_downTaps = ReducingTaps(1 << layout.chromaHeightShift, position.y);
    const int reach = m_downTaps.back().place - m_downTaps.front().place + 1;
    for (ChromaRows& chroma : m_chroma) {
        chroma.full = FloatRow(coding.width);
        chroma.phases.assign(std::size_t{1} << layout.chromaWidthShift,
                             FloatRow(m_chromaWidth + FloatRow::kPadding));
        chroma.across.assign(static_cast<std::size_t>(reach), FloatRow(m_chromaWidth));
    }
}

void PictureToFrame::SetMatrix(SampleType samples, const CodeMatrix& codes) {
    const double white = WhiteOf(samples);
    for (std::size_t k = 0; k < 3; ++k) {
        for (std::size_t i = 0; i < 3; ++i) {
            m_matrix.weight[k][i] = static_cast<float>(codes.fromRgb[k][i] / white);
        }
        m_zero[k] = static_cast<float>(codes.zero[k]);
    }
    if (!m_layout.hasAlpha) return;
    const int depth = m_layout.components[3].depth;
    m_matrix.alpha = static_cast<float>((depth == 32 ? 1.0 : (1 << depth) - 1) / white);
}

void PictureToFrame::Convert(const ConstPictureView& picture, AVFrame& frame) {
    const auto& components = m_layout.components;
    const bool isGrey = m_layout.ColourCount() == 1;
    const bool isReduced = m_layout.chromaWidthShift > 0 || m_layout.chromaHeightShift > 0;
    m_chromaY = 0;
    const ColourRows<float> rows = {m_luma.Samples(), m_chroma[0].full.Samples(), m_chroma[1].full.Samples(),
                                    m_layout.hasAlpha ? m_alpha.Samples() : nullptr};
    for (int y = 0; y < picture.height; ++y) {
        m_fromPixels(picture.Row(y), m_matrix, rows, m_width);
        WriteRow(m_kernels, rows.first, components[0], m_zero[0], y, m_width, frame);
        if (rows.alpha) WriteRow(m_kernels, rows.alpha, components[3], 0.0f, y, m_width, frame);
        if (isGrey) continue;
        if (isReduced) {
            for (ChromaRows& chroma : m_chroma) {
                ReduceAcross(chroma,
                             chroma.across[static_cast<std::size_t>(y) % chroma.across.size()].Samples());
            }
            WriteChroma(y, picture.height, frame);
        } else {
            WriteRow(m_kernels, rows.second, components[1], m_zero[1], y, m_width, frame);
            WriteRow(m_kernels, rows.third, components[2], m_zero[2], y, m_width, frame);
        }
    }
}

void PictureToFrame::ReduceAcross(ChromaRows& chroma, float* out) {
    const int shift = m_layout.chromaWidthShift;
    if (shift == 0) {
        std::copy_n(chroma.full.Samples(), m_width, out);
        return;
    }
    chroma.full.ExtendEnds(m_width);
    constexpr int kPadding = FloatRow::kPadding;
    const float* const first = chroma.full.Samples() - kPadding;
    const int before = kPadding >> shift, count = m_chromaWidth + 2 * before - 1;
    if (shift == 1) {
        m_kernels.separate(first, chroma.phases[0].Samples() - before, chroma.phases[1].Samples() - before,
                           count);
    } else {
        for (int i = 0; i < count << shift; ++i) {
            chroma.phases[RestOf(i, shift)].Samples()[FloorOf(i, shift) - before] = first[i];
        }
    }
    SumRows(m_kernels, m_acrossTaps, m_chromaWidth, out,
            [&](int place) { return chroma.phases[RestOf(place, shift)].Samples() + FloorOf(place, shift); });
}

// The rows of chroma for which row y is the last one needed.
void PictureToFrame::WriteChroma(int y, int height, AVFrame& frame) {
    const int shift = m_layout.chromaHeightShift;
    const int chromaHeight = ChromaSize(height, shift);
    for (; m_chromaY < chromaHeight; ++m_chromaY) {
        const int start = m_chromaY << shift;
        if (std::min(start + m_downTaps.back().place, height - 1) > y) return;
        for (std::size_t i = 0; i < 2; ++i) {
            ChromaRows& chroma = m_chroma[i];
            const auto row = [&](int place) {
                const auto number = static_cast<std::size_t>(std::clamp(start + place, 0, height - 1));
                return chroma.across[number % chroma.across.size()].Samples();
            };
            const float* sum = row(0);
            if (m_downTaps.size() > 1) {
                // The row at the size of luma is not needed any more.
                SumRows(m_kernels, m_downTaps, m_chromaWidth, chroma.full.Samples(), row);
                sum = chroma.full.Samples();
            }
            WriteRow(m_kernels, sum, m_layout.components[i + 1], m_zero[i + 1], m_chromaY, m_chromaWidth,
                     frame);
        }
    }
}

}  // namespace velmora::hosts

#include "programs/reelfx/conversion/frame_to_picture.h"

#include <algorithm>

namespace velmora::hosts {
namespace {

bool IsCopy(const FilterTaps& taps) {
    return taps.size() == 1 && taps.front().place == 0;
}

}  // namespace

FrameToPicture::FrameToPicture(const FrameCoding& coding, const SampleLayout& layout, SampleType samples,
                               const RowKernels& kernels)
    : m_layout(layout),
      m_kernels(kernels),
      m_toPixels(samples == SampleType::kBytes   ? kernels.toBytes
                 : samples == SampleType::kWords ? kernels.toWords
                                                 : kernels.toFloats),
      m_width(coding.width),
      m_chromaWidth(ChromaSize(coding.width, layout.chromaWidthShift)),
      m_chromaHeight(ChromaSize(coding.height, layout.chromaHeightShift)),
      m_luma(coding.width),
      m_alpha(coding.width) {
    SetMatrix(coding, samples);
    const ChromaPosition position = ChromaPositionOf(coding, layout);
    m_downTaps = EnlargingTaps(1 << layout.chromaHeightShift, position.y);
    m_acrossTaps = EnlargingTaps(1 << layout.chromaWidthShift, position.x);
    for (ChromaRows& chroma : m_chroma) {
        // Four taps reach over as many rows, and two phases over one more.
        chroma.read.assign(8, FloatRow(m_chromaWidth));
        chroma.numbers.assign(chroma.read.size(), -1);
        chroma.down = FloatRow(m_chromaWidth);
        chroma.phases.assign(m_acrossTaps.size(), FloatRow(m_chromaWidth));
        chroma.across = FloatRow(m_chromaWidth << layout.chromaWidthShift);
    }
}

void FrameToPicture::SetMatrix(const FrameCoding& coding, SampleType samples) {
    const CodeMatrix codes = MatrixOf(coding, m_layout);
    const double white = WhiteOf(samples);
    const double half = samples == SampleType::kFloats ? 0.0 : 0.5;
    for (std::size_t i = 0; i < 3; ++i) {
        double plus = half;
        for (std::size_t k = 0; k < 3; ++k) {
            m_matrix.weight[i][k] = static_cast<float>(white * codes.toRgb[i][k]);
            plus -= white * codes.toRgb[i][k] * codes.zero[k];
        }
        m_matrix.plus[i] = static_cast<float>(plus);
    }
    if (!m_layout.hasAlpha) return;
    const int depth = m_layout.components[3].depth;
    m_matrix.alpha = static_cast<float>(depth == 32 ? white : white / ((1 << depth) - 1));
    m_matrix.alphaPlus = static_cast<float>(half);
}

void FrameToPicture::Convert(const AVFrame& frame, const PictureView& picture) {
    for (ChromaRows& chroma : m_chroma) std::ranges::fill(chroma.numbers, -1);
    const bool isGrey = m_layout.ColourCount() == 1;
    for (int y = 0; y < picture.height; ++y) {
        const float* const luma = m_luma.Samples();
        ReadRow(m_kernels, frame, m_layout.components[0], y, m_width, m_luma.Samples());
        ColourRows<const float> rows = {luma, luma, luma, nullptr};
        if (!isGrey) {
            rows.second = ChromaRow(frame, 1, y);
            rows.third = ChromaRow(frame, 2, y);
        }
        if (m_layout.hasAlpha) {
            ReadRow(m_kernels, frame, m_layout.components[3], y, m_width, m_alpha.Samples());
            rows.alpha = m_alpha.Samples();
        }
        m_toPixels(rows, m_matrix, picture.Row(y), m_width);
    }
}

const float* FrameToPicture::ChromaRow(const AVFrame& frame, std::size_t component, int y) {
    ChromaRows& chroma = m_chroma[component - 1];
    const int shift = m_layout.chromaHeightShift, centre = y >> shift;
    const FilterTaps& taps = m_downTaps[static_cast<std::size_t>(y - (centre << shift))];
    if (IsCopy(taps)) return Across(chroma, ReadChroma(frame, component, centre));
    SumRows(m_kernels, taps, m_chromaWidth, chroma.down.Samples(),
            [&](int place) { return ReadChroma(frame, component, centre + place).Samples(); });
    chroma.down.ExtendEnds(m_chromaWidth);
    return Across(chroma, chroma.down);
}

const FloatRow& FrameToPicture::ReadChroma(const AVFrame& frame, std::size_t component, int y) {
    ChromaRows& chroma = m_chroma[component - 1];
    const int number = std::clamp(y, 0, m_chromaHeight - 1);
    const auto at = static_cast<std::size_t>(number) % chroma.read.size();
    FloatRow& row = chroma.read[at];
    if (chroma.numbers[at] != number) {
        ReadRow(m_kernels, frame, m_layout.components[component], number, m_chromaWidth, row.Samples());
        row.ExtendEnds(m_chromaWidth);
        chroma.numbers[at] = number;
    }
    return row;
}

const float* FrameToPicture::Across(ChromaRows& chroma, const FloatRow& row) {
    const std::size_t factor = m_acrossTaps.size();
    if (factor == 1) return row.Samples();
    const float* phases[4];
    for (std::size_t p = 0; p < factor; ++p) {
        phases[p] = row.Samples();
        if (IsCopy(m_acrossTaps[p])) continue;
        SumRows(m_kernels, m_acrossTaps[p], m_chromaWidth, chroma.phases[p].Samples(),
                [&](int place) { return row.Samples() + place; });
        phases[p] = chroma.phases[p].Samples();
    }
    float* const out = chroma.across.Samples();
    if (factor == 2) {
        m_kernels.interleave(phases[0], phases[1], out, m_chromaWidth);
        return out;
    }
    for (int i = 0; i < m_chromaWidth; ++i) {
        for (std::size_t p = 0; p < factor; ++p) out[static_cast<std::size_t>(i) * factor + p] = phases[p][i];
    }
    return out;
}

}  // namespace velmora::hosts

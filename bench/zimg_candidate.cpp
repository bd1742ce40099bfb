// The zimg library as a candidate. It converts planes; packing them to BGRA is a plain loop here.

#include <zimg.h>

#include <array>
#include <stdexcept>

#include "bench/conversion.h"
#include "programs/reelfx/conversion/frame_coding.h"

namespace velmora::bench {
namespace {

using hosts::BgraPicture;

struct FreeGraph {
    void operator()(zimg_filter_graph* graph) const { zimg_filter_graph_free(graph); }
};
struct FreeMemory {
    void operator()(void* memory) const { av_free(memory); }
};

class Zimg {
  public:
    Zimg(zimg_cpu_type_e level, bool isToBgra) : m_level(level), m_isToBgra(isToBgra) {}

    void ToBgra(const AVFrame& frame, BgraPicture& picture) {
        Run(frame);
        for (int y = 0; y < frame.height; ++y) {
            std::uint8_t* const out = picture.Row(y);
            for (int x = 0; x < frame.width; ++x) {
                for (int c = 0; c < 3; ++c) out[4 * x + c] = Row(2 - c, y)[x];
                out[4 * x + 3] = 255;
            }
        }
    }

    void FromBgra(const BgraPicture& picture, AVFrame& frame) {
        if (m_rgb && m_coding == hosts::CodingOf(frame))
            Unpack(picture);
        else
            SetUp(frame), Unpack(picture);
        Run(frame);
    }

  private:
    [[nodiscard]] std::uint8_t* Row(int channel, int y) const {
        return m_rgb->data[channel] + std::ptrdiff_t{y} * m_rgb->linesize[channel];
    }

    void Unpack(const BgraPicture& picture) const {
        for (int y = 0; y < picture.Height(); ++y) {
            for (int x = 0; x < picture.Width(); ++x) {
                for (int c = 0; c < 3; ++c) Row(c, y)[x] = picture.Row(y)[4 * x + 2 - c];
            }
        }
    }

    void Run(const AVFrame& frame) {
        if (!m_rgb || m_coding != hosts::CodingOf(frame)) SetUp(frame);
        zimg_image_buffer_const from = {.version = ZIMG_API_VERSION, .plane = {}};
        zimg_image_buffer to = {.version = ZIMG_API_VERSION, .plane = {}};
        const AVFrame& source = m_isToBgra ? frame : *m_rgb;
        const AVFrame& target = m_isToBgra ? *m_rgb : frame;
        for (int i = 0; i < 3; ++i) {
            from.plane[i] = {source.data[i], source.linesize[i], ZIMG_BUFFER_MAX};
            to.plane[i] = {target.data[i], target.linesize[i], ZIMG_BUFFER_MAX};
        }
        zimg_filter_graph_process(m_graph.get(), &from, &to, m_memory.get(), nullptr, nullptr, nullptr,
                                  nullptr);
    }

    void SetUp(const AVFrame& frame) {
        m_coding = hosts::CodingOf(frame);
        const auto layout = hosts::LayoutOf(m_coding.format);
        m_rgb = hosts::NewFrame();
        m_rgb->width = frame.width;
        m_rgb->height = frame.height;
        m_rgb->format = AV_PIX_FMT_YUV444P;  // three planes of bytes
        av_frame_get_buffer(m_rgb.get(), 64);
        zimg_image_format ycbcr, rgb;
        zimg_image_format_default(&ycbcr, ZIMG_API_VERSION);
        ycbcr.width = static_cast<unsigned>(frame.width);
        ycbcr.height = static_cast<unsigned>(frame.height);
        rgb = ycbcr;
        rgb.pixel_type = ZIMG_PIXEL_BYTE;
        rgb.color_family = ZIMG_COLOR_RGB;
        rgb.matrix_coefficients = ZIMG_MATRIX_RGB;
        rgb.pixel_range = ZIMG_RANGE_FULL;
        ycbcr.pixel_type = layout->components[0].depth > 8 ? ZIMG_PIXEL_WORD : ZIMG_PIXEL_BYTE;
        ycbcr.depth = static_cast<unsigned>(layout->components[0].depth);
        ycbcr.subsample_w = static_cast<unsigned>(layout->chromaWidthShift);
        ycbcr.subsample_h = static_cast<unsigned>(layout->chromaHeightShift);
        ycbcr.color_family = ZIMG_COLOR_YUV;
        ycbcr.matrix_coefficients = static_cast<zimg_matrix_coefficients_e>(frame.colorspace);
        ycbcr.pixel_range = frame.color_range == AVCOL_RANGE_JPEG ? ZIMG_RANGE_FULL : ZIMG_RANGE_LIMITED;
        ycbcr.chroma_location =
            frame.chroma_location == AVCHROMA_LOC_CENTER ? ZIMG_CHROMA_CENTER : ZIMG_CHROMA_LEFT;
        zimg_graph_builder_params options;
        zimg_graph_builder_params_default(&options, ZIMG_API_VERSION);
        options.resample_filter_uv = ZIMG_RESIZE_BICUBIC;
        options.filter_param_a_uv = 0.0;
        options.filter_param_b_uv = 0.6;
        options.cpu_type = m_level;
        m_graph.reset(
            zimg_filter_graph_build(m_isToBgra ? &ycbcr : &rgb, m_isToBgra ? &rgb : &ycbcr, &options));
        if (!m_graph) throw std::runtime_error("zimg refuses the conversion");
        std::size_t bytes = 0;
        zimg_filter_graph_get_tmp_size(m_graph.get(), &bytes);
        m_memory.reset(av_malloc(bytes));
    }

    zimg_cpu_type_e m_level;
    bool m_isToBgra;
    hosts::FrameCoding m_coding = {};
    hosts::FramePtr m_rgb;
    std::unique_ptr<zimg_filter_graph, FreeGraph> m_graph;
    std::unique_ptr<void, FreeMemory> m_memory;
};

Candidate Of(const std::string& name, zimg_cpu_type_e level) {
    const auto to = std::make_shared<Zimg>(level, true), from = std::make_shared<Zimg>(level, false);
    return {name, [to](const AVFrame& frame, BgraPicture& picture) { to->ToBgra(frame, picture); },
            [from](const BgraPicture& picture, AVFrame& frame) { from->FromBgra(picture, frame); }};
}

}  // namespace

std::vector<Candidate> ZimgCandidates() {
    std::vector<Candidate> candidates = {Of("zimg, without SIMD", ZIMG_CPU_NONE)};
#if defined(__x86_64__)
    candidates.push_back(Of("zimg, AVX2", ZIMG_CPU_X86_AVX2));
    candidates.push_back(Of("zimg, AVX-512", ZIMG_CPU_AUTO_64B));
#endif
    return candidates;
}

}  // namespace velmora::bench

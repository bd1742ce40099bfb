#include "bench/conversion.h"

#include "programs/reelfx/media/pixel_converter.h"

extern "C" {
#include <libavutil/opt.h>
#include <libavutil/pixdesc.h>
}

namespace velmora::bench {
namespace {

using hosts::BgraPicture;

// Converts between a frame and BGRA rows; set up once for each kind of frame.
class Scaler {
  public:
    Scaler(int flags, bool isToBgra) : m_flags(flags), m_isToBgra(isToBgra) {}

    void Run(const AVFrame& frame, const BgraPicture& picture) {
        if (!m_context || m_coding != hosts::CodingOf(frame)) SetUp(frame);
        std::uint8_t* const rows[4] = {const_cast<std::uint8_t*>(picture.Row(0))};
        const int strides[4] = {static_cast<int>(picture.Stride())};
        if (m_isToBgra) {
            sws_scale(m_context.get(), frame.data, frame.linesize, 0, frame.height, rows, strides);
        } else {
            sws_scale(m_context.get(), rows, strides, 0, frame.height, frame.data, frame.linesize);
        }
    }

  private:
    void SetUp(const AVFrame& frame) {
        m_coding = hosts::CodingOf(frame);
        m_context.reset(sws_alloc_context());
        SwsContext* const context = m_context.get();
        for (const char* side : {"src", "dst"}) {
            const bool isFrame = (side[0] == 's') == m_isToBgra;
            const auto set = [&](const char* what, std::int64_t value) {
                av_opt_set_int(context, (std::string(side) + what).c_str(), value, 0);
            };
            set("w", frame.width);
            set("h", frame.height);
            set("_format", isFrame ? frame.format : AV_PIX_FMT_BGRA);
            int x = 0, y = 0;
            if (!isFrame || avcodec_enum_to_chroma_pos(&x, &y, frame.chroma_location) < 0) continue;
            set("_h_chr_pos", x);
            if (av_pix_fmt_desc_get(m_coding.format)->log2_chroma_h == 1) set("_v_chr_pos", y);
        }
        av_opt_set_int(context, "sws_flags", m_flags, 0);
        const int* const matrix = sws_getCoefficients(frame.colorspace);
        const int isFull = frame.color_range == AVCOL_RANGE_JPEG ? 1 : 0;
        sws_setColorspaceDetails(context, matrix, m_isToBgra ? isFull : 1, matrix, m_isToBgra ? 1 : isFull, 0,
                                 1 << 16, 1 << 16);
        if (sws_init_context(context, nullptr, nullptr) < 0) throw std::bad_alloc();
    }

    int m_flags;
    bool m_isToBgra;
    hosts::FrameCoding m_coding = {};
    hosts::ScalerPtr m_context;
};

}  // namespace

Candidate ScalerCandidate(const std::string& name, int flags) {
    const auto to = std::make_shared<Scaler>(flags, true), from = std::make_shared<Scaler>(flags, false);
    return {name, [to](const AVFrame& frame, BgraPicture& picture) { to->Run(frame, picture); },
            [from](const BgraPicture& picture, AVFrame& frame) { from->Run(frame, picture); }};
}

Candidate OwnCandidate(const std::string& name) {
    const auto converter = std::make_shared<hosts::PixelConverter>();
    return {name,
            [converter](const AVFrame& frame, BgraPicture& picture) { converter->ToBgra(frame, picture); },
            [converter](const BgraPicture& picture, AVFrame& frame) { converter->FromBgra(picture, frame); }};
}

#if !VELMORA_HAS_ZIMG
std::vector<Candidate> ZimgCandidates() {
    return {};
}
#endif

}  // namespace velmora::bench

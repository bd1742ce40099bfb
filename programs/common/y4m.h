// YUV4MPEG2 streams, 8 bits: the header line, and frames converted from and to BGRA for hosts without a media
// library. Colours are in limited range, or in full range where the header says so. The format has no tag for
// the matrix: like players, this code assumes BT.709 for high definition and BT.601 below, unless told
// otherwise. Chroma is repeated over its pixels and averaged over them on the way back, so that an unchanged
// frame comes back as it was except for rounding.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "text/number_text.h"

namespace velmora::hosts {

enum class Y4mMatrix { kBt601, kBt709 };

// "bt601" or "bt709".
std::optional<Y4mMatrix> ParseY4mMatrix(std::string_view text);

struct Y4mFormat {
    FrameSize size;
    FrameRate rate = {25, 1};
    bool hasChroma = true;
    int chromaShiftX = 1;  // 1: one chroma sample for two columns
    int chromaShiftY = 1;
    bool isFullRange = false;
    Y4mMatrix matrix = Y4mMatrix::kBt601;

    [[nodiscard]] std::int32_t ChromaWidth() const;
    [[nodiscard]] std::int32_t ChromaHeight() const;
    // Bytes of one frame: luma, then Cb and Cr, without padding.
    [[nodiscard]] std::size_t FrameBytes() const;
};

// `line` is the stream's first line without its end. Throws UsageError when it is not such a header or the
// format is not an 8-bit one of 4:2:0, 4:2:2, 4:4:4 or grey.
Y4mFormat ParseY4mHeader(std::string_view line);

// `planes` holds FrameBytes() bytes, `bgra` width * height * 4. Alpha becomes 255.
void Y4mToBgra(const Y4mFormat& format, const std::uint8_t* planes, std::uint8_t* bgra);
// Alpha is not read.
void BgraToY4m(const Y4mFormat& format, const std::uint8_t* bgra, std::uint8_t* planes);

}  // namespace velmora::hosts

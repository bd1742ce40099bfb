#include "render/kernels.h"

#include <algorithm>
#include <cstring>

#include "render/shade.h"

namespace velmora::render {
namespace {

void TablesRow(const Bgra* in, Bgra* out, std::int32_t width, const ChannelTables& tables) noexcept {
    for (std::int32_t x = 0; x < width; ++x) {
        out[x] = {tables.blue[in[x].blue], tables.green[in[x].green], tables.red[in[x].red], in[x].alpha};
    }
}

void MixRow(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t weight) noexcept {
    for (std::int32_t x = 0; x < width; ++x) out[x] = MixWithGrey(in[x], weight);
}

void WearRow(const Bgra* in, Bgra* out, std::int32_t width, const float* fractions,
             std::uint32_t channels) noexcept {
    const bool onlyBlue = channels == kBlueChannel;
    for (std::int32_t x = 0; x < width; ++x) {
        const Bgra pixel = in[x], shaded = ShadePixel(pixel, fractions[x]);
        out[x] = onlyBlue ? Bgra{shaded.blue, pixel.green, pixel.red, pixel.alpha} : shaded;
    }
}

void CopyRow(const Bgra* in, Bgra* out, std::int32_t width) noexcept {
    std::memmove(out, in, static_cast<std::size_t>(width) * sizeof(Bgra));
}

void NothingToEnd() noexcept {}

void ToneRow(const Bgra* in, Bgra* out, std::int32_t width, const Tone& tone) noexcept {
    ToneInPasses(TablesRow, MixRow, in, out, width, tone);
}

void WearStrips(const Bgra* in, Bgra* out, std::int32_t width, const float* const* strips,
                std::int32_t stripWidth, std::uint32_t channels) noexcept {
    WearLinedUp(WearRow, in, out, width, strips, stripWidth, channels);
}

}  // namespace

const RowKernels kPlainKernels = {ToneRow, WearRow, CopyRow, CopyRow, NothingToEnd, WearStrips};

void ChannelTables::Set(const ByteTable& b, const ByteTable& g, const ByteTable& r) noexcept {
    blue = b;
    green = g;
    red = r;
    for (std::size_t i = 0; i < 256; ++i) {
        blueWord[i] = b[i];
        greenWord[i] = std::uint32_t{g[i]} << 8;
        redWord[i] = std::uint32_t{r[i]} << 16;
    }
}

const RowKernels& KernelsOf(Form form) noexcept {
    switch (form) {
#if defined(__i386__) || defined(__x86_64__)
        case Form::kAvx512:
            return kAvx512Kernels;
        case Form::kAvx2:
            return kAvx2Kernels;
        case Form::kSse2:
            return kSse2Kernels;
#endif
        default:
            return kPlainKernels;
    }
}

}  // namespace velmora::render

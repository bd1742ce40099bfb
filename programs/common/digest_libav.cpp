#include <memory>
#include <new>

#include "programs/common/digest.h"

extern "C" {
#include <libavutil/md5.h>
#include <libavutil/mem.h>
}

namespace velmora::hosts {

std::string FrameDigest(const std::uint8_t* pixels, std::int32_t width, std::int32_t height,
                        std::ptrdiff_t strideBytes) {
    const std::unique_ptr<AVMD5, void (*)(void*)> md5(av_md5_alloc(), av_free);
    if (!md5) throw std::bad_alloc();
    av_md5_init(md5.get());
    for (std::int32_t y = 0; y < height; ++y) {
        av_md5_update(md5.get(), pixels + y * strideBytes, static_cast<std::size_t>(width) * 4);
    }
    std::uint8_t sum[16];
    av_md5_final(md5.get(), sum);
    return HexOf(sum, sizeof sum);
}

}  // namespace velmora::hosts

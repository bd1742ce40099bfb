#include "programs/reelfx/media/pixel_converter.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <cstring>
#include <random>

#include "bench/conversion.h"
#include "effects/render_session.h"

extern "C" {
#include <libavutil/pixdesc.h>
}

namespace velmora::hosts {
namespace {

using bench::Plane;
using bench::Planes;

// A picture with guarded rows.
struct Picture {
    static constexpr std::uint8_t kGuard = 0x5A;
    Picture(int width, int height, SampleType type)
        : stride(width * BytesPerPixel(type) + 64), bytes(static_cast<std::size_t>(stride * height), kGuard) {
        view = {bytes.data(), stride, width, height, type};
    }
    [[nodiscard]] ConstPictureView Const() const {
        return {bytes.data(), stride, view.width, view.height, view.samples};
    }
    // Channel 0 is red; 1 is white.
    [[nodiscard]] double At(int x, int y, int channel) const {
        const std::uint8_t* const pixel = view.Row(y) + x * BytesPerPixel(view.samples);
        if (view.samples == SampleType::kBytes) return pixel[channel == 3 ? 3 : 2 - channel] / 255.0;
        if (view.samples == SampleType::kFloats)
            return static_cast<double>(reinterpret_cast<const float*>(pixel)[channel]);
        return reinterpret_cast<const std::uint16_t*>(pixel)[channel] / 65535.0;
    }
    [[nodiscard]] bool IsPaddingKept() const {
        for (std::int32_t y = 0; y < view.height; ++y) {
            for (std::ptrdiff_t i = view.width * BytesPerPixel(view.samples); i < stride; ++i) {
                if (view.Row(y)[i] != kGuard) return false;
            }
        }
        return true;
    }
    std::ptrdiff_t stride;
    std::vector<std::uint8_t> bytes;
    PictureView view = {};
};

struct Case {
    AVPixelFormat format;
    int depth, widthShift, heightShift;
    AVChromaLocation chroma = AVCHROMA_LOC_UNSPECIFIED;
    AVColorRange range = AVCOL_RANGE_MPEG;
    double x = -1.0, y = -1.0;  // of chroma, if not in the middle

    [[nodiscard]] bench::YcbcrCoding Coding() const {
        const bool isFull = range == AVCOL_RANGE_JPEG;
        return {depth,
                widthShift,
                heightShift,
                0.2627,
                0.0593,
                isFull,
                x < 0.0 ? ((1 << widthShift) - 1) / 2.0 : x,
                y < 0.0 ? ((1 << heightShift) - 1) / 2.0 : y};
    }
};

constexpr Case kCases[] = {
    {AV_PIX_FMT_YUV420P, 8, 1, 1},
    {AV_PIX_FMT_YUV420P, 8, 1, 1, AVCHROMA_LOC_LEFT, AVCOL_RANGE_JPEG, 0.0, 0.5},
    {AV_PIX_FMT_YUV420P, 8, 1, 1, AVCHROMA_LOC_TOPLEFT, AVCOL_RANGE_MPEG, 0.0, 0.0},
    {AV_PIX_FMT_YUV420P, 8, 1, 1, AVCHROMA_LOC_BOTTOM, AVCOL_RANGE_MPEG, 0.5, 1.0},
    {AV_PIX_FMT_YUV422P10, 10, 1, 0, AVCHROMA_LOC_LEFT, AVCOL_RANGE_MPEG, 0.0, 0.0},
    {AV_PIX_FMT_YUV444P12BE, 12, 0, 0},
    {AV_PIX_FMT_YUV440P, 8, 0, 1},
    {AV_PIX_FMT_YUV411P, 8, 2, 0},
    {AV_PIX_FMT_YUV410P, 8, 2, 2},
    {AV_PIX_FMT_YUVJ422P, 8, 1, 0, AVCHROMA_LOC_UNSPECIFIED, AVCOL_RANGE_JPEG},
    {AV_PIX_FMT_YUVA420P10, 10, 1, 1},
    {AV_PIX_FMT_NV21, 8, 1, 1},
    {AV_PIX_FMT_P010, 10, 1, 1},
    {AV_PIX_FMT_UYVY422, 8, 1, 0},
    {AV_PIX_FMT_YUV444P16, 16, 0, 0},
};

FramePtr FrameOf(AVPixelFormat format, int width, int height, const Case& test = {}) {
    FramePtr frame = NewFrame();
    frame->width = width;
    frame->height = height;
    frame->format = format;
    frame->colorspace = AVCOL_SPC_BT2020_NCL;
    frame->color_range = test.range;
    frame->chroma_location = test.chroma;
    if (av_frame_get_buffer(frame.get(), 0) < 0) throw std::bad_alloc();
    // The library's writer of samples only sets bits.
    for (const AVBufferRef* buffer : frame->buf) {
        if (buffer) std::memset(buffer->data, 0, buffer->size);
    }
    return frame;
}

// Samples by the library's own view of its formats.
void PutCode(AVFrame& frame, int component, int x, int y, int code) {
    const auto value = static_cast<std::uint16_t>(code);
    av_write_image_line2(&value, frame.data, frame.linesize,
                         av_pix_fmt_desc_get(static_cast<AVPixelFormat>(frame.format)), x, y, component, 1,
                         2);
}
int CodeAt(const AVFrame& frame, int component, int x, int y) {
    std::uint16_t value = 0;
    const std::uint8_t* data[4] = {frame.data[0], frame.data[1], frame.data[2], frame.data[3]};
    av_read_image_line2(&value, data, frame.linesize,
                        av_pix_fmt_desc_get(static_cast<AVPixelFormat>(frame.format)), x, y, component, 1, 0,
                        2);
    return value;
}

// Codes around the middle, so that no colour is beyond what RGB has.
Planes FillYcbcr(const Case& test, AVFrame& frame) {
    std::mt19937 random(3);
    Planes codes;
    for (int c = 0; c < 3; ++c) {
        const int w = c == 0 ? 0 : test.widthShift, h = c == 0 ? 0 : test.heightShift;
        Plane& plane = codes[static_cast<std::size_t>(c)];
        plane = Plane((frame.width + (1 << w) - 1) >> w, (frame.height + (1 << h) - 1) >> h);
        for (int y = 0; y < plane.height; ++y) {
            for (int x = 0; x < plane.width; ++x) {
                const int code =
                    (100 << (test.depth - 8)) + static_cast<int>(random() % (40U << (test.depth - 8)));
                plane.At(x, y) = code;
                PutCode(frame, c, x, y, code);
            }
        }
    }
    const AVPixFmtDescriptor* const descriptor = av_pix_fmt_desc_get(test.format);
    for (int y = 0; (descriptor->flags & AV_PIX_FMT_FLAG_ALPHA) != 0 && y < frame.height; ++y) {
        for (int x = 0; x < frame.width; ++x) PutCode(frame, 3, x, y, (1 << test.depth) - 1 - x);
    }
    return codes;
}

std::string NameOf(const Case& test) {
    return std::string(av_get_pix_fmt_name(test.format)) + " chroma " + std::to_string(test.chroma);
}

TEST(PixelConverter, RoundsExactColoursOnce) {
    for (const Case& test : kCases) {
        for (const SampleType type : {SampleType::kBytes, SampleType::kWords, SampleType::kFloats}) {
            // Packed pairs of pixels need a whole number of them.
            const int width = test.format == AV_PIX_FMT_UYVY422 ? 34 : 35, height = 19;
            SCOPED_TRACE(NameOf(test) + " samples " + std::to_string(static_cast<int>(type)));
            const FramePtr frame = FrameOf(test.format, width, height, test);
            const Planes exact = ExactRgb(test.Coding(), FillYcbcr(test, *frame));
            Picture picture(width, height, type);
            PixelConverter converter;
            converter.ToPicture(*frame, picture.view);
            EXPECT_TRUE(picture.IsPaddingKept());
            const double unit = type == SampleType::kBytes   ? 255.0
                                : type == SampleType::kWords ? 65535.0
                                                             : 2e5;
            const bool hasAlpha = test.format == AV_PIX_FMT_YUVA420P10;
            double worst = 0.0;
            Planes stored = exact;
            for (int y = 0; y < height; ++y) {
                for (int x = 0; x < width; ++x) {
                    for (int c = 0; c < 3; ++c) {
                        double& value = stored[static_cast<std::size_t>(c)].At(x, y);
                        worst = std::max(worst, std::abs(value - picture.At(x, y, c)) * unit);
                        value = picture.At(x, y, c);
                    }
                    const double alpha = hasAlpha ? 1.0 - x / 1023.0 : 1.0;
                    worst = std::max(worst, std::abs(alpha - picture.At(x, y, 3)) * unit);
                }
            }
            EXPECT_LT(worst, type == SampleType::kWords ? 0.52 : 0.501);

            const FramePtr back = FrameOf(test.format, width, height, test);
            converter.FromPicture(picture.Const(), *back);
            const Planes codes = ExactCodes(test.Coding(), stored);
            worst = 0.0;
            for (int c = 0; c < 3; ++c) {
                const Plane& plane = codes[static_cast<std::size_t>(c)];
                for (int y = 0; y < plane.height; ++y) {
                    for (int x = 0; x < plane.width; ++x) {
                        worst = std::max(worst, std::abs(plane.Near(x, y) - CodeAt(*back, c, x, y)));
                    }
                }
            }
            EXPECT_LT(worst, 0.52);
            if (hasAlpha && type != SampleType::kBytes) {
                EXPECT_EQ(CodeAt(*back, 3, 30, 5), 1023 - 30);
            }
        }
    }
}

TEST(PixelConverter, KeepsDeepSamples) {
    for (const AVPixelFormat format :
         {AV_PIX_FMT_GBRP10, AV_PIX_FMT_RGB48BE, AV_PIX_FMT_RGBA64LE, AV_PIX_FMT_GBRAP16, AV_PIX_FMT_GRAY16,
          AV_PIX_FMT_YA16BE, AV_PIX_FMT_RGB24}) {
        SCOPED_TRACE(av_get_pix_fmt_name(format));
        const AVPixFmtDescriptor& descriptor = *av_pix_fmt_desc_get(format);
        const int highest = (1 << descriptor.comp[0].depth) - 1, width = 37;
        const FramePtr frame = FrameOf(format, width, 5), back = FrameOf(format, width, 5);
        for (int i = 0; i < width * 5; ++i) {
            for (int c = 0; c < descriptor.nb_components; ++c) {
                PutCode(*frame, c, i % width, i / width, (i * 349 + c * 7001) % (highest + 1));
            }
        }
        for (const SampleType type : {SampleType::kWords, SampleType::kFloats}) {
            Picture picture(width, 5, type);
            PixelConverter converter;
            converter.ToPicture(*frame, picture.view);
            converter.FromPicture(picture.Const(), *back);
            EXPECT_NEAR(picture.At(9, 3, 1),
                        CodeAt(*frame, descriptor.nb_components > 2 ? 1 : 0, 9, 3) / double(highest), 1e-5);
            for (int i = 0; i < width * 5; ++i) {
                for (int c = 0; c < descriptor.nb_components; ++c) {
                    ASSERT_EQ(CodeAt(*back, c, i % width, i / width), CodeAt(*frame, c, i % width, i / width))
                        << i;
                }
            }
        }
    }
}

TEST(PixelConverter, FloatsKeepWhatIsBeyondBlackAndWhite) {
    const Case test = {AV_PIX_FMT_YUV444P10, 10, 0, 0};
    const FramePtr frame = FrameOf(test.format, 64, 48, test), back = FrameOf(test.format, 64, 48, test);
    std::mt19937 random(5);
    for (int i = 0; i < 64 * 48 * 3; ++i)
        PutCode(*frame, i % 3, i / 3 % 64, i / 3 / 64, static_cast<int>(random() % 1024));
    Picture picture(64, 48, SampleType::kFloats);
    PixelConverter converter;
    converter.ToPicture(*frame, picture.view);
    converter.FromPicture(picture.Const(), *back);
    for (int i = 0; i < 64 * 48 * 3; ++i) {
        ASSERT_EQ(CodeAt(*back, i % 3, i / 3 % 64, i / 3 / 64),
                  CodeAt(*frame, i % 3, i / 3 % 64, i / 3 / 64));
    }
}

TEST(PixelConverter, GivesTheSameBytesAtEveryLevel) {
    for (const Case& test : kCases) {
        for (const SampleType type : {SampleType::kBytes, SampleType::kWords, SampleType::kFloats}) {
            SCOPED_TRACE(NameOf(test));
            std::vector<std::uint8_t> pixels;
            std::vector<int> codes;
            for (const char* level : {"plain", "avx2", "avx512"}) {
                ASSERT_EQ(setenv(kSimdVariable, level, 1), 0);
                const FramePtr frame = FrameOf(test.format, 98, 11, test);
                FillYcbcr(test, *frame);
                Picture picture(98, 11, type);
                PixelConverter converter;
                converter.ToPicture(*frame, picture.view);
                converter.FromPicture(picture.Const(), *frame);
                std::vector<int> found;
                found.reserve(98 * 11 + 24 * 2);
                for (int i = 0; i < 98 * 11; ++i) found.push_back(CodeAt(*frame, 0, i % 98, i / 98));
                for (int i = 0; i < 24 * 2; ++i) found.push_back(CodeAt(*frame, 2, i % 24, i / 24));
                if (pixels.empty()) pixels = picture.bytes, codes = found;
                EXPECT_TRUE(picture.bytes == pixels && found == codes) << level;
            }
            unsetenv(kSimdVariable);
        }
    }
}

// These go through the library's scaler.
TEST(PixelConverter, TakesPalettesAndOtherSizes) {
    const FramePtr frame = FrameOf(AV_PIX_FMT_PAL8, 32, 16);
    for (int y = 0; y < 16; ++y)
        std::fill_n(frame->data[0] + std::ptrdiff_t{y} * frame->linesize[0], 32, std::uint8_t{3});
    reinterpret_cast<std::uint32_t*>(frame->data[1])[3] = 0xFF804020;  // alpha, red, green, blue
    for (const SampleType type : {SampleType::kBytes, SampleType::kWords, SampleType::kFloats}) {
        for (const int width : {32, 20}) {
            Picture picture(width, 16, type);
            PixelConverter().ToPicture(*frame, picture.view);
            const double allowed = type == SampleType::kBytes && width == 32 ? 1e-9 : 0.006;
            EXPECT_NEAR(picture.At(7, 7, 0), 0x80 / 255.0, allowed);
            EXPECT_NEAR(picture.At(7, 7, 2), 0x20 / 255.0, allowed);
            const FramePtr small = FrameOf(AV_PIX_FMT_RGB565, width, 16);
            PixelConverter().FromPicture(picture.Const(), *small);
            EXPECT_NEAR(CodeAt(*small, 0, 7, 7) / 31.0, 0x80 / 255.0, 0.03);
        }
    }
}

}  // namespace
}  // namespace velmora::hosts

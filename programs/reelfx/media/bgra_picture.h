// A picture in memory in the layout of the effects: rows from the top, of blue, green, red and alpha bytes, or of deep
// samples in the order red, green, blue and alpha (SampleType); and how a picture is turned.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "api/host_api.h"
#include "programs/reelfx/conversion/picture_view.h"
#include "render/deep/deep_renderer.h"

struct AVFrame;
struct AVStream;

namespace velmora::hosts {

class BgraPicture {
  public:
    BgraPicture() = default;
    BgraPicture(std::int32_t width, std::int32_t height, SampleType samples = SampleType::kBytes)
        : m_samples(samples) {
        Resize(width, height);
    }

    // As a picture of the other's kind of samples.
    void ResizeLike(const BgraPicture& other, std::int32_t width, std::int32_t height) {
        m_samples = other.m_samples;
        Resize(width, height);
    }

    void Resize(std::int32_t width, std::int32_t height) {
        m_width = width;
        m_height = height;
        // Vector code of the converters reads and writes past a row's end.
        m_stride = (width * PixelBytes() + 63) / 64 * 64 + 64;
        m_bytes.resize(static_cast<std::size_t>(m_stride) * static_cast<std::size_t>(height) + 64);
    }

    [[nodiscard]] std::int32_t Width() const { return m_width; }
    [[nodiscard]] std::int32_t Height() const { return m_height; }
    [[nodiscard]] std::ptrdiff_t Stride() const { return m_stride; }  // bytes
    [[nodiscard]] SampleType Samples() const { return m_samples; }
    [[nodiscard]] std::ptrdiff_t PixelBytes() const { return BytesPerPixel(m_samples); }
    // Of a row, without its padding.
    [[nodiscard]] std::size_t RowBytes() const { return static_cast<std::size_t>(m_width * PixelBytes()); }
    [[nodiscard]] std::uint8_t* Row(std::int32_t y) { return m_bytes.data() + y * m_stride; }
    [[nodiscard]] const std::uint8_t* Row(std::int32_t y) const { return m_bytes.data() + y * m_stride; }

    [[nodiscard]] PictureView View() { return {Row(0), m_stride, m_width, m_height, m_samples}; }
    [[nodiscard]] ConstPictureView View() const { return {Row(0), m_stride, m_width, m_height, m_samples}; }

    // For effects on deep samples.
    [[nodiscard]] render::DeepPicture Deep() { return {Row(0), m_stride}; }
    // For effects on bytes; valid until the picture is resized.
    FrameRecord Record() {
        return {m_bytes.data(), m_width, m_height, static_cast<std::int32_t>(m_stride), 0, 0, 0};
    }

  private:
    SampleType m_samples = SampleType::kBytes;
    std::int32_t m_width = 0, m_height = 0;
    std::ptrdiff_t m_stride = 0;
    std::vector<std::uint8_t> m_bytes;
};

// Cameras held in another position store the picture as it comes from the sensor, with a tag that says how players
// must rotate or mirror it. Effects are applied to the picture as it is seen: scratches run from top to bottom for
// the viewer (picture_turn.cpp).
//
// A point moves by a step of (xx, yx) for a step to the right, and of (xy, yy) for a step down; each is -1, 0 or 1.
struct PictureTurn {
    int xx = 1, xy = 0;
    int yx = 0, yy = 1;

    bool operator==(const PictureTurn&) const = default;
    [[nodiscard]] bool IsNone() const { return *this == PictureTurn{}; }
    [[nodiscard]] bool SwapsSides() const { return xx == 0; }
    [[nodiscard]] PictureTurn Back() const { return {xx, yx, xy, yy}; }
    // "rotated by 90 degrees", "mirrored", "mirrored and rotated by 90 degrees"; clockwise.
    [[nodiscard]] std::string Words() const;
    [[nodiscard]] int Degrees() const;  // clockwise, after mirroring left and right if it is mirrored
    [[nodiscard]] bool IsMirrored() const { return xx * yy - xy * yx < 0; }
};

// How players turn the stream's picture. A tag on the frame, as in photographs, takes precedence.
PictureTurn TurnOf(const AVStream& stream, const AVFrame& first);

void TurnPicture(const BgraPicture& from, const PictureTurn& turn, BgraPicture& to);

}  // namespace velmora::hosts

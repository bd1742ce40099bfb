#include <windows.h>
#include <vfw.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "programs/reelview/source/open_clip_win32.h"
#include "programs/reelview/base/texts.h"
#include "platform/win32.h"

namespace velmora::reelview {
namespace {

struct AviSystem {
    AviSystem() { AVIFileInit(); }
    ~AviSystem() { AVIFileExit(); }
    AviSystem(const AviSystem&) = delete;
    AviSystem& operator=(const AviSystem&) = delete;
};

using Stream = support::win32::Owner<PAVISTREAM, &AVIStreamRelease>;
using Frames = support::win32::Owner<PGETFRAME, &AVIStreamGetFrameClose>;

const std::uint8_t* PixelsBehind(const BITMAPINFOHEADER& header) {
    const auto* bytes = reinterpret_cast<const std::uint8_t*>(&header);
    const DWORD colours =
        header.biBitCount <= 8 && header.biClrUsed == 0 ? 1u << header.biBitCount : header.biClrUsed;
    return bytes + header.biSize + colours * sizeof(RGBQUAD);
}

// A packed bitmap of 8, 24 or 32 bits, stored bottom-up or top-down.
Picture PictureOf(const BITMAPINFOHEADER& header) {
    const int bits = header.biBitCount;
    const bool isKnown = header.biCompression == BI_RGB && (bits == 8 || bits == 24 || bits == 32);
    if (!isKnown) throw SourceError(text::kCannotReadFrame);
    Picture picture;
    picture.size = {header.biWidth, std::abs(header.biHeight)};
    CheckSize(picture.size);
    picture.pixels.resize(Picture::BytesOf(picture.size));
    const auto* palette = reinterpret_cast<const std::uint8_t*>(&header) + header.biSize;
    const std::uint8_t* pixels = PixelsBehind(header);
    const auto width = static_cast<std::size_t>(header.biWidth);
    const std::size_t rowBytes = (width * static_cast<std::size_t>(bits) + 31) / 32 * 4;
    std::uint8_t* out = picture.pixels.data();
    for (std::int32_t y = 0; y < picture.size.height; ++y) {
        const std::int32_t stored = header.biHeight > 0 ? picture.size.height - 1 - y : y;
        const std::uint8_t* row = pixels + static_cast<std::size_t>(stored) * rowBytes;
        for (std::size_t x = 0; x < width; ++x, out += 4) {
            const std::uint8_t* pixel =
                bits == 8 ? palette + row[x] * 4u : row + x * static_cast<std::size_t>(bits / 8);
            std::memcpy(out, pixel, 3);
            out[3] = 255;
        }
    }
    return picture;
}

class AviClip final : public ClipSource {
  public:
    explicit AviClip(const std::wstring& file) {
        PAVISTREAM stream = nullptr;
        if (AVIStreamOpenFromFileW(&stream, AviPath(file).c_str(), streamtypeVIDEO, 0,
                                   OF_READ | OF_SHARE_DENY_WRITE, nullptr) != 0) {
            throw SourceError(text::kCannotRead);
        }
        m_stream.reset(stream);
        AVISTREAMINFOW info = {};
        if (AVIStreamInfoW(stream, &info, sizeof info) != 0 || info.dwLength == 0)
            throw SourceError(text::kNoFrames);
        m_start = static_cast<LONG>(info.dwStart);
        m_facts.frames = info.dwLength;
        if (info.dwRate > 0 && info.dwRate < 0x7FFFFFFF && info.dwScale > 0 && info.dwScale < 0x7FFFFFFF) {
            m_facts.rate = {static_cast<std::int32_t>(info.dwRate), static_cast<std::int32_t>(info.dwScale)};
        }
        OpenFrames();
        m_facts.size = Read(0).size;
    }

    Picture Read(std::int64_t frame) override {
        const auto* header = static_cast<const BITMAPINFOHEADER*>(
            AVIStreamGetFrame(m_frames.get(), m_start + static_cast<LONG>(frame)));
        if (header == nullptr) throw SourceError(text::kCannotReadFrame);
        return PictureOf(*header);
    }

  private:
    // Every decoder can give 24 bits; if this one does not, take its preferred format.
    void OpenFrames() {
        LONG size = 0;
        if (AVIStreamReadFormat(m_stream.get(), m_start, nullptr, &size) != 0 || size < 16) {
            throw SourceError(text::kCannotRead);
        }
        std::vector<std::uint8_t> format(
            std::max<std::size_t>(static_cast<std::size_t>(size), sizeof(BITMAPINFOHEADER)));
        AVIStreamReadFormat(m_stream.get(), m_start, format.data(), &size);
        BITMAPINFOHEADER wanted = {};
        std::memcpy(&wanted, format.data(), sizeof wanted);
        CheckSize({wanted.biWidth, std::abs(wanted.biHeight)});
        wanted.biSize = sizeof wanted;
        wanted.biHeight = std::abs(wanted.biHeight);
        wanted.biPlanes = 1;
        wanted.biBitCount = 24;
        wanted.biCompression = BI_RGB;
        wanted.biClrUsed = wanted.biClrImportant = 0;
        wanted.biSizeImage = static_cast<DWORD>((wanted.biWidth * 3 + 3) / 4 * 4 * wanted.biHeight);
        m_frames.reset(AVIStreamGetFrameOpen(m_stream.get(), &wanted));
        if (!m_frames) m_frames.reset(AVIStreamGetFrameOpen(m_stream.get(), nullptr));
        if (!m_frames) throw SourceError(text::kNoDecoder);
    }

    AviSystem m_system;  // must outlive the open file and stream
    Stream m_stream;
    Frames m_frames;
    LONG m_start = 0;
};

}  // namespace

std::unique_ptr<ClipSource> OpenAviClip(const std::wstring& file) {
    return std::make_unique<AviClip>(file);
}

}  // namespace velmora::reelview

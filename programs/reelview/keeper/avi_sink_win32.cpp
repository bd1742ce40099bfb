#include "programs/reelview/keeper/export_job_win32.h"

#include <cstring>
#include <filesystem>
#include <fstream>
#include <utility>

#include "programs/reelview/keeper/frame_sink.h"
#include "programs/reelview/source/open_clip_win32.h"
#include "programs/reelview/base/texts.h"
#include "platform/win32.h"

namespace velmora::reelview {
namespace {

using Stream = support::win32::Owner<PAVISTREAM, &AVIStreamRelease>;
using File = support::win32::Owner<PAVIFILE, &AVIFileRelease>;

// The old file format uses 31-bit byte counts.
constexpr std::int64_t kMostBytes = 2'000'000'000;

struct AviSystem {
    AviSystem() { AVIFileInit(); }
    ~AviSystem() { AVIFileExit(); }
    AviSystem(const AviSystem&) = delete;
    AviSystem& operator=(const AviSystem&) = delete;
};

std::size_t RowBytes(hosts::FrameSize size) {
    return (static_cast<std::size_t>(size.width) * 3 + 3) / 4 * 4;
}

BITMAPINFOHEADER HeaderOf(hosts::FrameSize size) {
    BITMAPINFOHEADER header = {};
    header.biSize = sizeof header;
    header.biWidth = size.width;
    header.biHeight = size.height;
    header.biPlanes = 1;
    header.biBitCount = 24;
    header.biCompression = BI_RGB;
    header.biSizeImage = static_cast<DWORD>(RowBytes(size) * static_cast<std::size_t>(size.height));
    return header;
}

void Check(HRESULT result, const char* error) {
    if (result != 0) throw SourceError(error);
}

class AviSink final : public FrameSink {
  public:
    AviSink(const std::wstring& file, const ClipFacts& facts, const AviCodec& codec)
        : m_safe{std::filesystem::path(file)},
          m_header(HeaderOf(facts.size)),
          m_bitmap(m_header.biSizeImage) {
        if (codec.handler == 0 && facts.frames * std::int64_t{m_header.biSizeImage} > kMostBytes) {
            throw SourceError(text::kAviTooLarge);
        }
        // Only an existing file has a short path.
        std::ofstream{m_safe.Place()};
        PAVIFILE created = nullptr;
        Check(
            AVIFileOpenW(&created, AviPath(m_safe.Place().wstring()).c_str(), OF_CREATE | OF_WRITE, nullptr),
            text::kCannotWrite);
        m_file.reset(created);
        AddStream(facts);
        if (codec.handler != 0) Compress(codec);
        Check(AVIStreamSetFormat(Target(), 0, &m_header, static_cast<LONG>(sizeof m_header)),
              text::kCodecRefuses);
    }

    void Write(const Picture& picture) override {
        const std::size_t rowBytes = RowBytes(picture.size);
        const std::uint8_t* pixel = picture.pixels.data();
        for (std::int32_t y = 0; y < picture.size.height; ++y) {
            std::uint8_t* out =
                m_bitmap.data() + static_cast<std::size_t>(picture.size.height - 1 - y) * rowBytes;
            for (std::int32_t x = 0; x < picture.size.width; ++x, pixel += 4, out += 3)
                std::memcpy(out, pixel, 3);
        }
        LONG written = 0;
        Check(AVIStreamWrite(Target(), m_count++, 1, m_bitmap.data(), static_cast<LONG>(m_bitmap.size()),
                             AVIIF_KEYFRAME, nullptr, &written),
              text::kCannotWrite);
        m_bytes += written;
        if (m_bytes > kMostBytes) throw SourceError(text::kAviTooLarge);
    }

    void Finish() override {
        m_compressed.reset();
        m_stream.reset();
        m_file.reset();
        m_safe.Finish();
    }

  private:
    void AddStream(const ClipFacts& facts) {
        AVISTREAMINFOW info = {};
        info.fccType = streamtypeVIDEO;
        info.dwRate = static_cast<DWORD>(facts.rate.numerator);
        info.dwScale = static_cast<DWORD>(facts.rate.denominator);
        info.dwSuggestedBufferSize = m_header.biSizeImage;
        info.rcFrame = {0, 0, facts.size.width, facts.size.height};
        PAVISTREAM stream = nullptr;
        Check(AVIFileCreateStreamW(m_file.get(), &stream, &info), text::kCannotWrite);
        m_stream.reset(stream);
    }

    void Compress(const AviCodec& codec) {
        AVICOMPRESSOPTIONS options = {};
        options.fccType = streamtypeVIDEO;
        options.fccHandler = codec.handler;
        options.dwQuality = codec.quality;
        options.dwKeyFrameEvery = codec.keyFrameEvery;
        options.dwFlags = AVICOMPRESSF_VALID | (codec.keyFrameEvery != 0 ? AVICOMPRESSF_KEYFRAMES : 0u);
        options.lpParms = const_cast<std::uint8_t*>(codec.state.data());
        options.cbParms = static_cast<DWORD>(codec.state.size());
        PAVISTREAM stream = nullptr;
        Check(AVIMakeCompressedStream(&stream, m_stream.get(), &options, nullptr), text::kCodecRefuses);
        m_compressed.reset(stream);
    }

    [[nodiscard]] PAVISTREAM Target() const { return m_compressed ? m_compressed.get() : m_stream.get(); }

    AviSystem m_system;
    SafeFile m_safe;  // must outlive the open file
    File m_file;
    Stream m_stream, m_compressed;
    BITMAPINFOHEADER m_header;
    std::vector<std::uint8_t> m_bitmap;
    LONG m_count = 0;
    std::int64_t m_bytes = 0;
};

}  // namespace

std::optional<AviCodec> ChooseAviCodec(HWND owner, hosts::FrameSize size) {
    BITMAPINFOHEADER header = HeaderOf(size);
    COMPVARS choice = {};
    choice.cbSize = sizeof choice;
    choice.dwFlags = ICMF_COMPVARS_VALID;
    choice.fccType = ICTYPE_VIDEO;
    if (!ICCompressorChoose(owner, ICMF_CHOOSE_ALLCOMPRESSORS | ICMF_CHOOSE_KEYFRAME, &header, nullptr,
                            &choice, nullptr)) {
        return std::nullopt;
    }
    AviCodec codec;
    const bool isPlain = choice.fccHandler == 0 || choice.fccHandler == mmioFOURCC('D', 'I', 'B', ' ');
    if (!isPlain) {
        codec.handler = choice.fccHandler;
        codec.quality = static_cast<DWORD>(choice.lQ);
        codec.keyFrameEvery = static_cast<DWORD>(choice.lKey);
        if (choice.cbState > 0 && choice.lpState != nullptr) {
            const auto* state = static_cast<const std::uint8_t*>(choice.lpState);
            codec.state.assign(state, state + choice.cbState);
        }
    }
    ICCompressorFree(&choice);
    return codec;
}

std::unique_ptr<FrameSink> MakeAviSink(const std::wstring& file, const ClipFacts& facts,
                                       const AviCodec& codec) {
    return std::make_unique<AviSink>(file, facts, codec);
}

}  // namespace velmora::reelview

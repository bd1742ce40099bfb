#include "programs/reelview/keeper/frame_sink.h"

#include <fstream>
#include <string>
#include <system_error>
#include <utility>
#include <vector>

#include "programs/reelview/base/texts.h"
#include "programs/reelview/source/clip_source.h"

namespace velmora::reelview {
namespace {

hosts::Y4mFormat FormatFor(const ClipFacts& facts) {
    if (facts.y4m) return *facts.y4m;
    hosts::Y4mFormat format;
    format.size = facts.size;
    format.rate = facts.rate;
    format.chromaShiftX = format.chromaShiftY = 0;
    const bool isHighDefinition = facts.size.width >= 1280 || facts.size.height > 576;
    format.matrix = isHighDefinition ? hosts::Y4mMatrix::kBt709 : hosts::Y4mMatrix::kBt601;
    return format;
}

std::string HeaderOf(const hosts::Y4mFormat& format) {
    const char* chroma = "444";
    if (!format.hasChroma)
        chroma = "mono";
    else if (format.chromaShiftY == 1)
        chroma = "420jpeg";
    else if (format.chromaShiftX == 1)
        chroma = "422";
    return "YUV4MPEG2 W" + std::to_string(format.size.width) + " H" + std::to_string(format.size.height) +
           " F" + std::to_string(format.rate.numerator) + ':' + std::to_string(format.rate.denominator) +
           " Ip A1:1 C" + chroma + (format.isFullRange ? " XCOLORRANGE=FULL" : "") + '\n';
}

class Y4mSink final : public FrameSink {
  public:
    Y4mSink(const std::filesystem::path& file, const ClipFacts& facts)
        : m_file(file),
          m_format(FormatFor(facts)),
          m_planes(m_format.FrameBytes()),
          m_stream(m_file.Place(), std::ios::binary) {
        const std::string header = HeaderOf(m_format);
        Put(header.data(), header.size());
    }

    void Write(const Picture& picture) override {
        hosts::BgraToY4m(m_format, picture.pixels.data(), m_planes.data());
        Put("FRAME\n", 6);
        Put(reinterpret_cast<const char*>(m_planes.data()), m_planes.size());
    }

    void Finish() override {
        m_stream.close();
        if (!m_stream) throw SourceError(text::kCannotWrite);
        m_file.Finish();
    }

  private:
    void Put(const char* bytes, std::size_t count) {
        m_stream.write(bytes, static_cast<std::streamsize>(count));
        if (!m_stream) throw SourceError(text::kCannotWrite);
    }

    SafeFile m_file;  // must outlive the stream: an open file cannot be removed
    hosts::Y4mFormat m_format;
    std::vector<std::uint8_t> m_planes;
    std::ofstream m_stream;
};

}  // namespace

std::unique_ptr<FrameSink> MakeY4mSink(const std::filesystem::path& file, const ClipFacts& facts) {
    return std::make_unique<Y4mSink>(file, facts);
}

SafeFile::SafeFile(std::filesystem::path target) : m_target(std::move(target)), m_place(m_target) {
    std::filesystem::path name = m_target.stem();
    name += ".unfinished";
    std::error_code error;
    for (int i = 0; i < 100; ++i) {
        std::filesystem::path tried = name;
        if (i > 0) tried += std::to_string(i);
        tried += m_target.extension();
        m_place.replace_filename(tried);
        if (!std::filesystem::exists(m_place, error)) break;
    }
}

SafeFile::~SafeFile() {
    std::error_code error;
    if (!m_isFinished) std::filesystem::remove(m_place, error);
}

void SafeFile::Finish() {
    std::error_code error;
    std::filesystem::rename(m_place, m_target, error);
    if (error) throw SourceError(text::kCannotWrite);
    m_isFinished = true;
}

}  // namespace velmora::reelview

#include "programs/reelview/source/clip_source.h"

#include <fstream>
#include <string>
#include <vector>

#include "text/number_text.h"
#include "programs/reelview/base/texts.h"

namespace velmora::reelview {
namespace {

constexpr std::size_t kLongestLine = 1024;

std::optional<std::string> ReadLine(std::istream& stream) {
    std::string line;
    for (int c = stream.get(); c != '\n'; c = stream.get()) {
        if (c == std::istream::traits_type::eof() || line.size() == kLongestLine) return std::nullopt;
        line += static_cast<char>(c);
    }
    return line;
}

class Y4mClip final : public ClipSource {
  public:
    explicit Y4mClip(const std::filesystem::path& file) : m_stream(file, std::ios::binary) {
        if (!m_stream) throw SourceError(text::kCannotOpen);
        const auto header = ReadLine(m_stream);
        if (!header) throw SourceError(text::kCannotRead);
        try {
            m_format = hosts::ParseY4mHeader(*header);
        } catch (const hosts::UsageError&) {
            throw SourceError(text::kCannotRead);
        }
        CheckSize(m_format.size);
        FindFrames();
        if (m_places.empty()) throw SourceError(text::kNoFrames);
        m_planes.resize(m_format.FrameBytes());
        m_facts.size = m_format.size;
        m_facts.rate = m_format.rate;
        m_facts.frames = static_cast<std::int64_t>(m_places.size());
        m_facts.y4m = m_format;
    }

    Picture Read(std::int64_t frame) override {
        m_stream.clear();
        m_stream.seekg(m_places.at(static_cast<std::size_t>(frame)));
        m_stream.read(reinterpret_cast<char*>(m_planes.data()),
                      static_cast<std::streamsize>(m_planes.size()));
        if (!m_stream) throw SourceError(text::kCannotReadFrame);
        Picture picture{m_format.size, std::vector<std::uint8_t>(Picture::BytesOf(m_format.size))};
        hosts::Y4mToBgra(m_format, m_planes.data(), picture.pixels.data());
        return picture;
    }

  private:
    // A frame header may carry parameters, so the offsets are not evenly spaced.
    void FindFrames() {
        const auto start = m_stream.tellg();
        m_stream.seekg(0, std::ios::end);
        const auto end = m_stream.tellg();
        m_stream.seekg(start);
        const auto bytes = static_cast<std::streamoff>(m_format.FrameBytes());
        while (const auto line = ReadLine(m_stream)) {
            if (!line->starts_with("FRAME")) break;
            const auto place = m_stream.tellg();
            if (end - place < bytes) break;
            m_places.push_back(place);
            m_stream.seekg(place + bytes);
        }
    }

    std::ifstream m_stream;
    hosts::Y4mFormat m_format;
    std::vector<std::streampos> m_places;
    std::vector<std::uint8_t> m_planes;
};

}  // namespace

void CheckSize(hosts::FrameSize size) {
    if (size.width < 1 || size.height < 1) throw SourceError(text::kCannotRead);
    // The source, the result and the displayed picture are in memory at the same time.
    constexpr std::int64_t kLargestArea = std::int64_t{1} << 27;
    const bool isTooLarge = size.width > kLargestSide || size.height > kLargestSide ||
                            std::int64_t{size.width} * size.height > kLargestArea;
    if (isTooLarge) throw SourceError(text::kTooLarge);
}

std::unique_ptr<ClipSource> OpenY4mClip(const std::filesystem::path& file) {
    return std::make_unique<Y4mClip>(file);
}

}  // namespace velmora::reelview

#include "programs/reelhost/frame_stream.h"

#include <stdexcept>

#include "text/number_text.h"

namespace velmora::hosts {

FrameInput::FrameInput(std::FILE* file, std::optional<FrameSize> rawSize, std::optional<FrameRate> rate,
                       std::optional<Y4mMatrix> matrix)
    : m_file(file), m_isRaw(rawSize.has_value()) {
    if (m_isRaw) {
        m_format.size = *rawSize;
    } else {
        if (!ReadLine(m_header)) throw UsageError("the input is empty");
        m_format = ParseY4mHeader(m_header);
        m_planes.resize(m_format.FrameBytes());
    }
    if (rate) m_format.rate = *rate;
    if (matrix) m_format.matrix = *matrix;
}

bool FrameInput::ReadLine(std::string& line) {
    constexpr std::size_t kLongest = 1024;
    line.clear();
    for (int c = std::getc(m_file); c != '\n'; c = std::getc(m_file)) {
        if (c == EOF && !line.empty()) throw UsageError("the input ends inside a line");
        if (c == EOF) return false;
        if (line.size() == kLongest) throw UsageError("the input is not a YUV4MPEG2 stream");
        line += static_cast<char>(c);
    }
    return true;
}

bool FrameInput::ReadBytes(std::vector<std::uint8_t>& bytes) {
    const std::size_t count = std::fread(bytes.data(), 1, bytes.size(), m_file);
    if (count != bytes.size() && (count != 0 || !m_isRaw)) {
        throw UsageError("the input ends inside a frame");
    }
    return count != 0;
}

bool FrameInput::Read(std::vector<std::uint8_t>& bgra) {
    bgra.resize(static_cast<std::size_t>(m_format.size.width) *
                static_cast<std::size_t>(m_format.size.height) * 4);
    if (m_isRaw) return ReadBytes(bgra);
    std::string line;
    if (!ReadLine(line)) return false;
    if (!line.starts_with("FRAME")) throw UsageError("the YUV4MPEG2 stream is damaged");
    ReadBytes(m_planes);
    Y4mToBgra(m_format, m_planes.data(), bgra.data());
    return true;
}

FrameOutput::FrameOutput(std::FILE* file, const FrameInput& input)
    : m_file(file), m_isRaw(input.m_isRaw), m_format(input.m_format) {
    if (m_isRaw) return;
    m_planes.resize(m_format.FrameBytes());
    WriteBytes(input.m_header.data(), input.m_header.size());
    WriteBytes("\n", 1);
}

void FrameOutput::WriteBytes(const void* bytes, std::size_t count) {
    if (std::fwrite(bytes, 1, count, m_file) != count) {
        throw std::runtime_error("the output does not take the frame");
    }
}

void FrameOutput::Write(const std::vector<std::uint8_t>& bgra) {
    if (m_isRaw) {
        WriteBytes(bgra.data(), bgra.size());
        return;
    }
    BgraToY4m(m_format, bgra.data(), m_planes.data());
    WriteBytes("FRAME\n", 6);
    WriteBytes(m_planes.data(), m_planes.size());
}

void FrameOutput::Finish() {
    if (std::fflush(m_file) != 0) throw std::runtime_error("the output does not take the frame");
}

}  // namespace velmora::hosts

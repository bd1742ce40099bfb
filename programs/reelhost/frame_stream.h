// Reads frames from one stream and writes them to another: raw BGRA, or YUV4MPEG2 where no size is given. The streams
// are binary and belong to the caller.
#pragma once

#include <cstdint>
#include <cstdio>
#include <optional>
#include <string>
#include <vector>

#include "text/number_text.h"
#include "programs/common/y4m.h"

namespace velmora::hosts {

class FrameInput {
  public:
    // Without `rawSize`, reads a YUV4MPEG2 header for size and rate. Throws UsageError when there is none.
    FrameInput(std::FILE* file, std::optional<FrameSize> rawSize, std::optional<FrameRate> rate,
               std::optional<Y4mMatrix> matrix);

    [[nodiscard]] FrameSize Size() const { return m_format.size; }
    [[nodiscard]] FrameRate Rate() const { return m_format.rate; }

    // False at the end. Throws UsageError when the stream ends inside a frame.
    bool Read(std::vector<std::uint8_t>& bgra);

  private:
    friend class FrameOutput;
    bool ReadLine(std::string& line);
    bool ReadBytes(std::vector<std::uint8_t>& bytes);

    std::FILE* m_file;
    bool m_isRaw;
    Y4mFormat m_format;
    std::string m_header;
    std::vector<std::uint8_t> m_planes;
};

// Writes in the input's format.
class FrameOutput {
  public:
    FrameOutput(std::FILE* file, const FrameInput& input);
    // Throws std::runtime_error when the frame cannot be written.
    void Write(const std::vector<std::uint8_t>& bgra);
    void Finish();

  private:
    void WriteBytes(const void* bytes, std::size_t count);

    std::FILE* m_file;
    bool m_isRaw;
    Y4mFormat m_format;
    std::vector<std::uint8_t> m_planes;
};

}  // namespace velmora::hosts

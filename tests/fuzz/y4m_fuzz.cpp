// Arbitrary bytes as a YUV4MPEG2 stream through both readers: reelhost's own reader and writer, and reelfx's, which
// uses the media libraries. A stream must be refused with a one-line message for the user, or read in order as frames
// of one size.

#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "text/number_text.h"
#include "programs/common/y4m.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/media/media_reader.h"
#include "programs/reelhost/frame_stream.h"
#include "tests/fuzz/fuzz_input.h"

extern "C" {
#include <libavutil/log.h>
}

namespace {

using namespace velmora::hosts;
using velmora::fuzz::Require;

constexpr int kMostFrames = 8;

// A file in memory, closed at the end.
class MemoryFile {
  public:
    MemoryFile(const std::uint8_t* data, std::size_t size) : m_descriptor(memfd_create("stream", 0)) {
        Require(m_descriptor >= 0);
        Require(write(m_descriptor, data, size) == static_cast<ssize_t>(size));
        Rewind();
    }
    ~MemoryFile() { close(m_descriptor); }
    MemoryFile(const MemoryFile&) = delete;
    MemoryFile& operator=(const MemoryFile&) = delete;

    [[nodiscard]] int Descriptor() const { return m_descriptor; }
    void Rewind() const { lseek(m_descriptor, 0, SEEK_SET); }

  private:
    int m_descriptor;
};

// The header alone may promise gigabytes; requesting them is not a fault.
bool IsHandy(std::string_view stream) {
    try {
        return ParseY4mHeader(stream.substr(0, stream.find('\n'))).FrameBytes() <= std::size_t{1} << 18;
    } catch (const UsageError& error) {
        Require(*error.what() != '\0');
        return true;
    }
}

void ReadAsReelhost(const MemoryFile& stream) {
    std::FILE* const in = fdopen(dup(stream.Descriptor()), "rb");
    std::FILE* const out = std::fopen("/dev/null", "wb");
    Require(in != nullptr && out != nullptr);
    try {
        FrameInput input(in, std::nullopt, std::nullopt, std::nullopt);
        FrameOutput output(out, input);
        Require(input.Rate().numerator >= 1 && input.Rate().denominator >= 1);
        std::vector<std::uint8_t> bgra;
        for (int i = 0; i < kMostFrames && input.Read(bgra); ++i) {
            const auto pixels =
                static_cast<std::size_t>(input.Size().width) * static_cast<std::size_t>(input.Size().height);
            Require(bgra.size() == pixels * 4);
            for (std::size_t pixel = 0; pixel < pixels; ++pixel) Require(bgra[pixel * 4 + 3] == 255);
            output.Write(bgra);
        }
        output.Finish();
    } catch (const UsageError& error) {
        Require(*error.what() != '\0');
    }
    std::fclose(in);
    std::fclose(out);
}

void ReadAsReelfx(const MemoryFile& stream) {
    Require(dup2(stream.Descriptor(), STDIN_FILENO) == STDIN_FILENO);
    try {
        MediaReader reader({"-", std::nullopt, std::nullopt});
        Require(reader.FrameRateGuess().num > 0 && reader.FrameRateGuess().den > 0 &&
                reader.FrameCountGuess() >= 0);
        std::optional<std::int64_t> before;
        for (int i = 0; i < kMostFrames; ++i) {
            const MediaReader::Item item = reader.Next();
            if (!item.frame) break;
            Require(item.frame->width == reader.FirstFrame().width &&
                    item.frame->height == reader.FirstFrame().height);
            Require(!before || item.frame->pts > *before);
            Require(i != 0 || reader.SecondsOf(item.frame->pts) == 0.0);
            before = item.frame->pts;
        }
    } catch (const Failure& failure) {
        Require(*failure.what() != '\0' && failure.Code() == kExitInput);
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    av_log_set_level(AV_LOG_QUIET);
    if (!IsHandy({reinterpret_cast<const char*>(data), size})) return 0;
    const MemoryFile stream(data, size);
    ReadAsReelhost(stream);
    stream.Rewind();
    ReadAsReelfx(stream);
    return 0;
}

// How reelhost reads its command line and its input: the parts that need no library.

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "text/number_text.h"
#include "programs/reelhost/frame_stream.h"
#include "programs/reelhost/host_options.h"

namespace velmora::hosts {
namespace {

HostOptions Read(std::vector<std::string> words) {
    words.insert(words.begin(), "reelhost");
    std::vector<char*> arguments;
    arguments.reserve(words.size());
    for (std::string& word : words) arguments.push_back(word.data());
    return ReadHostOptions(static_cast<int>(arguments.size()), arguments.data());
}

TEST(ReelhostOptions, AreReadOrRefused) {
    const HostOptions options =
        Read({"--effect", "Film Look", "--size", "4x2", "--matrix", "bt709", "--frames", "0"});
    EXPECT_EQ(options.rate->numerator, 30) << "raw frames have no header that tells it";
    EXPECT_EQ(options.matrix, Y4mMatrix::kBt709);
    EXPECT_EQ(options.frameLimit, 0);
    const std::vector<std::vector<std::string>> wrong = {
        {},
        {"--effect"},
        {"--effect", "a", "--frames", "-1"},
        {"--effect", "a", "--matrix", "709"},
        {"--frame", "1"},
    };
    for (const auto& words : wrong) EXPECT_THROW(Read(words), UsageError) << words.size();
}

// The frames that a stream yields before it ends or is rejected.
struct Outcome {
    int frames = 0;
    std::string refusal;
};
Outcome ReadAll(const std::string& stream) {
    std::FILE* const file = std::tmpfile();
    std::fwrite(stream.data(), 1, stream.size(), file);
    std::rewind(file);
    Outcome outcome;
    try {
        FrameInput input(file, std::nullopt, std::nullopt, std::nullopt);
        std::vector<std::uint8_t> bgra;
        while (input.Read(bgra)) ++outcome.frames;
    } catch (const UsageError& error) {
        outcome.refusal = error.what();
    }
    std::fclose(file);
    return outcome;
}

TEST(ReelhostInput, TellsAnEndFromABreak) {
    const std::string header = "YUV4MPEG2 W2 H1 Cmono\n", frame = "FRAME\nab";
    struct Row {
        std::string stream;
        int frames;
        bool isWhole;
    };
    const Row rows[] = {
        {"", 0, false},
        {header.substr(0, 9), 0, false},
        {header, 0, true},
        {header + frame + frame, 2, true},
        {header + frame + "FRA", 1, false},
        {header + frame + "FRAME\na", 1, false},
        {header + "frame\nab", 0, false},
    };
    for (const Row& row : rows) {
        const Outcome outcome = ReadAll(row.stream);
        EXPECT_EQ(outcome.frames, row.frames) << row.stream;
        EXPECT_EQ(outcome.refusal.empty(), row.isWhole) << row.stream;
    }
}

}  // namespace
}  // namespace velmora::hosts

#include "programs/reelhost/host_options.h"

#include <string_view>

#include "text/number_text.h"

namespace velmora::hosts {

const char* const kHostHelp =
    "reelhost: renders frames through VMReelEffects.dll, standard input to standard output.\n"
    "\n"
    "  reelhost --effect NAME [--preset NAME] [--set NAME=VALUE]... [--size WxH] [--rate FPS]\n"
    "           [--matrix NAME] [--frames N] [--hash] [--dll PATH]\n"
    "  reelhost --all-presets NAME|all --size WxH [--rate FPS] [--frames N]\n"
    "  reelhost --list\n"
    "  reelhost --bench [--dll PATH]\n"
    "  reelhost --soak FRAMES [--dll PATH]\n"
    "\n"
    "  --size         frames are raw BGRA of this size; without it they are YUV4MPEG2\n"
    "  --rate         frames per second (default 30, or the YUV4MPEG2 header's)\n"
    "  --matrix       colours of YUV4MPEG2: bt601 or bt709 (default: bt709 from 1280 pixels or 577 rows on)\n"
    "  --frames       read no more than N frames\n"
    "  --hash         print the MD5 of each frame's BGRA instead of writing frames\n"
    "  --all-presets  hash the frames for every preset of an effect, or of all\n"
    "  --bench        measure the effects on 1920x1080 frames, beside memcpy\n"
    "  --soak         render at least FRAMES 1920x1080 frames through all presets: is memory or time lost?\n"
    "  --dll          the library (default: beside this program)\n"
    "\n"
    "The state of the library's random sequence at the first frame goes to standard error, with "
    "--all-presets\n"
    "to standard output before each preset: reelfx --random-state plays the same damage.\n"
    "Exit codes: 0 done, 1 the library or the output failed or the soak shows growth, 2 command line or "
    "input.\n";

namespace {

class ArgumentReader {
  public:
    ArgumentReader(int count, char** arguments) : m_next(arguments + 1), m_end(arguments + count) {}

    [[nodiscard]] bool AtEnd() const { return m_next == m_end; }
    std::string_view Name() { return m_name = *m_next++; }
    std::string Value() {
        if (AtEnd()) Fail("a value");
        return *m_next++;
    }
    template <class Parse>
    auto Value(Parse parse, const char* expected) {
        const auto value = parse(Value());
        if (!value) Fail(expected);
        return *value;
    }
    [[noreturn]] void Fail(const char* expected) const {
        throw UsageError(std::string(m_name) + " takes " + expected);
    }

  private:
    char** m_next;
    char** m_end;
    std::string_view m_name;
};

std::optional<std::int64_t> ParseFrameCount(std::string_view text) {
    const auto count = ParseInteger(text);
    return count && *count >= 0 ? count : std::nullopt;
}

}  // namespace

HostOptions ReadHostOptions(int count, char** arguments) {
    HostOptions options;
    ArgumentReader reader(count, arguments);
    while (!reader.AtEnd()) {
        const std::string_view name = reader.Name();
        if (name == "--help" || name == "-h") {
            options.mode = HostMode::kHelp;
        } else if (name == "--list") {
            options.mode = HostMode::kList;
        } else if (name == "--bench") {
            options.mode = HostMode::kBench;
        } else if (name == "--soak") {
            options.mode = HostMode::kSoak;
            options.frameLimit = reader.Value(ParseInteger, "a number of frames");
        } else if (name == "--all-presets") {
            options.mode = HostMode::kAllPresets;
            options.effect = reader.Value();
        } else if (name == "--effect") {
            options.effect = reader.Value();
        } else if (name == "--preset") {
            options.preset = reader.Value();
        } else if (name == "--set") {
            options.settings.push_back(reader.Value());
        } else if (name == "--size") {
            options.size = reader.Value(ParseSize, "a size like 1920x1080");
        } else if (name == "--rate") {
            options.rate = reader.Value(ParseRate, "a rate like 25 or 30000/1001");
        } else if (name == "--matrix") {
            options.matrix = reader.Value(ParseY4mMatrix, "bt601 or bt709");
        } else if (name == "--frames") {
            options.frameLimit = reader.Value(ParseFrameCount, "a number of frames from 0");
        } else if (name == "--hash") {
            options.withDigests = true;
        } else if (name == "--dll") {
            options.dll = reader.Value();
        } else {
            throw UsageError("there is no option " + std::string(name) + "; see --help");
        }
    }
    if (options.mode == HostMode::kRender && options.effect.empty()) {
        throw UsageError("--effect is missing; see --help");
    }
    if (options.size && !options.rate) options.rate = FrameRate{30, 1};
    return options;
}

}  // namespace velmora::hosts

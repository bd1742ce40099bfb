// reelhost: a minimal host of the library. It renders its input through the real DLL.

#include <cstdio>
#include <exception>
#include <fcntl.h>
#include <io.h>
#include <new>
#include <stdexcept>

#include "programs/common/digest.h"
#include "text/number_text.h"
#include "programs/common/effect_library.h"
#include "programs/common/effect_run.h"
#include "programs/reelhost/frame_stream.h"
#include "programs/reelhost/host_options.h"
#include "programs/reelhost/measurements.h"
#include "text/names.h"

namespace velmora::hosts {
namespace {

using Frame = std::vector<std::uint8_t>;

std::string DigestOf(const Frame& frame, FrameSize size) {
    return FrameDigest(frame.data(), size.width, size.height, std::ptrdiff_t{size.width} * 4);
}

void List(const EffectLibrary& library) {
    for (const EffectInfo& effect : library.Effects()) {
        std::printf("%s\n", effect.name.c_str());
        for (const ParamInfo& param : effect.params) {
            if (!param.HoldsValue()) continue;
            std::printf("  %-18s %-10s (%s)\n", param.name.c_str(), KindName(param.kind),
                        ShownValue(param, param.defaultValue).c_str());
        }
        std::printf("  presets: %s\n", QuotedList(effect.presets).c_str());
    }
}

FrameInput StandardInput(const HostOptions& options) {
    _setmode(_fileno(stdin), _O_BINARY);
    return {stdin, options.size, options.rate, options.matrix};
}

void Render(const HostOptions& options, const EffectLibrary& library) {
    const auto index = static_cast<std::uint32_t>(FindEffect(library.Effects(), options.effect));
    const EffectInfo& info = library.Effects()[index];
    EffectRun run(library, index);
    if (options.preset) run.ApplyPreset(FindPreset(info, *options.preset));
    for (const std::string& setting : options.settings) run.Set(ParseSetting(info, setting));
    FrameInput input = StandardInput(options);
    std::optional<FrameOutput> output;
    if (!options.withDigests) {
        _setmode(_fileno(stdout), _O_BINARY);
        output.emplace(stdout, input);
    }
    RandomStateFinder finder(library);
    std::fprintf(stderr, "random state %s\n", HexText(finder.Find()).c_str());
    Frame source, result;
    for (std::int64_t i = 0; i < options.frameLimit.value_or(i + 1) && input.Read(source); ++i) {
        result.resize(source.size());
        run.Render(input.Size(), source, result, input.Rate().SecondsAt(i));
        if (options.withDigests) {
            std::printf("%s\n", DigestLine(i, DigestOf(result, input.Size())).c_str());
        } else {
            output->Write(result);
        }
    }
    if (output) output->Finish();
}

void HashPresets(const EffectLibrary& library, std::uint32_t effect, const FrameInput& input,
                 const std::vector<Frame>& frames, RandomStateFinder& finder) {
    const EffectInfo& info = library.Effects()[effect];
    Frame result;
    for (std::uint32_t preset = 0; preset < info.presets.size(); ++preset) {
        EffectRun run(library, effect);
        run.ApplyPreset(preset);
        std::printf("effect \"%s\" preset \"%s\" random state %s\n", info.name.c_str(),
                    info.presets[preset].c_str(), HexText(finder.Find()).c_str());
        for (std::size_t i = 0; i < frames.size(); ++i) {
            result.resize(frames[i].size());
            const auto number = static_cast<std::int64_t>(i);
            run.Render(input.Size(), frames[i], result, input.Rate().SecondsAt(number));
            std::printf("%s\n", DigestLine(number, DigestOf(result, input.Size())).c_str());
        }
    }
}

void HashAllPresets(const HostOptions& options, const EffectLibrary& library) {
    FrameInput input = StandardInput(options);
    std::vector<Frame> frames;
    Frame frame;
    while ((!options.frameLimit || static_cast<std::int64_t>(frames.size()) < *options.frameLimit) &&
           input.Read(frame)) {
        frames.push_back(frame);
    }
    RandomStateFinder finder(library);
    if (!IsSameName(options.effect, "all")) {
        const std::size_t effect = FindEffect(library.Effects(), options.effect);
        HashPresets(library, static_cast<std::uint32_t>(effect), input, frames, finder);
        return;
    }
    for (std::uint32_t effect = 0; effect < library.Effects().size(); ++effect) {
        HashPresets(library, effect, input, frames, finder);
    }
}

void Run(const HostOptions& options) {
    if (options.mode == HostMode::kHelp) {
        std::fputs(kHostHelp, stdout);
        return;
    }
    const EffectLibrary library(options.dll);
    switch (options.mode) {
        case HostMode::kBench:
            PrintBench(library);
            break;
        case HostMode::kSoak:
            if (!RunSoak(library, *options.frameLimit)) throw std::runtime_error("the soak shows growth");
            break;
        case HostMode::kList:
            List(library);
            break;
        case HostMode::kAllPresets:
            HashAllPresets(options, library);
            break;
        default:
            Render(options, library);
            break;
    }
}

}  // namespace
}  // namespace velmora::hosts

int main(int count, char** arguments) {
    using namespace velmora::hosts;
    try {
        Run(ReadHostOptions(count, arguments));
        return 0;
    } catch (const UsageError& error) {
        std::fprintf(stderr, "reelhost: %s\n", error.what());
        return 2;
    } catch (const std::bad_alloc&) {
        std::fprintf(stderr, "reelhost: not enough memory\n");
        return 1;
    } catch (const std::exception& error) {
        std::fprintf(stderr, "reelhost: %s\n", error.what());
        return 1;
    }
}

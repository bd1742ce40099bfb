#include "programs/reelfx/commands/commands.h"

#include <cstdio>
#include <exception>
#include <filesystem>
#include <map>
#include <nlohmann/json.hpp>

#include "text/number_text.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/common/output_place.h"
#include "programs/reelfx/media/container.h"
#include "programs/reelfx/pipeline/effect_list.h"

extern "C" {
#include <libavformat/avformat.h>
}

namespace velmora::hosts {
namespace {

namespace fs = std::filesystem;

std::string ExtensionOf(const OutputOptions& output, const fs::path& input) {
    if (output.isRawBgra) return ".bgra";
    const AVOutputFormat* format = output.format ? FormatNamed(*output.format) : nullptr;
    if (format == nullptr || format->extensions == nullptr) return input.extension().string();
    const std::string usual = format->extensions;
    return '.' + usual.substr(0, usual.find(','));
}

class Batch {
  public:
    explicit Batch(const BatchOptions& options)
        : m_options(options), m_progress(Resolved(options.render.progress)) {
        std::map<std::string, std::string> inputOf;
        for (const std::string& input : options.inputs) {
            if (input == "-") throw UsageError("--into needs clips with names, not standard input");
            const std::string out = BatchOutput(options, input);
            if (const auto [other, isNew] = inputOf.emplace(out, input); !isNew) {
                std::string both = other->second;
                both.append(" and ").append(input).append(" would both be written to ").append(out);
                throw UsageError(both);
            }
            m_outputs.push_back(out);
        }
        std::error_code ignored;
        for (const std::string& out : m_outputs) {
            if (!fs::exists(out, ignored)) continue;
            for (const std::string& input : options.inputs) CheckIsNotInput(out, input);
        }
        const EffectList effects(
            options.render.effects);  // reports an error in these once, not for each clip
    }

    ExitCode Run() {
        const MadeFolder folder(m_options.folder);
        for (std::size_t i = 0; i < m_outputs.size() && m_result != kExitInterrupted; ++i) Render(i);
        Summarise();
        return m_result;
    }

  private:
    void Render(std::size_t clip) {
        const std::string& input = m_options.inputs[clip];
        RenderOptions options = m_options.render;
        options.input.path = input;
        options.output->path = m_outputs[clip];
        Announce(clip);
        try {
            velmora::hosts::Run(options);
            ++m_done;
        } catch (const Failure& failure) {
            Report(input, failure.what(), failure.Code());
        } catch (const UsageError& error) {
            Report(input, error.what(), kExitUsage);
        } catch (const std::bad_alloc&) {
            Report(input, "not enough memory", kExitInternal);
        } catch (const std::exception& error) {
            Report(input, error.what(), kExitInternal);
        }
    }

    void Announce(std::size_t clip) const {
        const std::string &input = m_options.inputs[clip], &out = m_outputs[clip];
        if (m_progress == ProgressKind::kText) {
            std::fprintf(stderr, "%s -> %s (%zu of %zu)\n", input.c_str(), out.c_str(), clip + 1,
                         m_outputs.size());
        } else if (m_progress == ProgressKind::kJson) {
            const nlohmann::ordered_json line = {
                {"clip", clip + 1}, {"clips", m_outputs.size()}, {"input", input}, {"output", out}};
            std::fprintf(stderr, "%s\n",
                         line.dump(-1, ' ', false, nlohmann::json::error_handler_t::replace).c_str());
        }
    }

    void Report(const std::string& input, const std::string& what, ExitCode code) {
        const bool isNamed = what.starts_with(input) || what.starts_with(BatchOutput(m_options, input));
        std::fprintf(stderr, "reelfx: %s%s%s\n", isNamed ? "" : input.c_str(), isNamed ? "" : ": ",
                     what.c_str());
        // An interrupt stops all clips.
        if (m_result == kExitDone || code == kExitInterrupted) m_result = code;
    }

    void Summarise() const {
        if (m_result == kExitDone && m_progress != ProgressKind::kText) return;
        std::fprintf(stderr, "reelfx: %zu of %zu clips rendered\n", m_done, m_outputs.size());
    }

    const BatchOptions& m_options;
    ProgressKind m_progress;
    std::vector<std::string> m_outputs;
    std::size_t m_done = 0;
    ExitCode m_result = kExitDone;
};

}  // namespace

std::string BatchOutput(const BatchOptions& options, const std::string& input) {
    const fs::path path(input);
    return (fs::path(options.folder) / path.stem()).string() + ExtensionOf(*options.render.output, path);
}

ExitCode Run(const BatchOptions& options) {
    return Batch(options).Run();
}

}  // namespace velmora::hosts

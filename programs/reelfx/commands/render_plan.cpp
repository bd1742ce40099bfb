#include "programs/reelfx/commands/render_plan.h"

#include "text/number_text.h"
#include "programs/reelfx/media/media_facts.h"

namespace velmora::hosts {
namespace {

std::string Line(std::string name, const std::string& text) {
    name.resize(10, ' ');
    return name + text + '\n';
}

std::string SectionText(const SectionOptions& options, std::int64_t frames) {
    if (options.IsWholeClip()) return "the whole clip";
    std::string text;
    if (options.start || options.duration) {
        text = "from " + NumberText(options.start.value_or(0.0)) + " s";
        if (options.duration) text += " for " + NumberText(*options.duration) + " s";
    } else {
        text = "from frame " + std::to_string(options.firstFrame);
        if (options.endFrame) text += " up to but not including " + std::to_string(*options.endFrame);
    }
    return frames > 0 ? text + " (" + std::to_string(frames) + " frames)" : text;
}

std::string SettingsText(const EffectChoice& choice) {
    std::string text;
    for (std::uint32_t i = 0; i < choice.Info().params.size(); ++i) {
        const ParamInfo& param = choice.Info().params[i];
        if (!param.HoldsValue()) continue;
        text += (text.empty() ? "" : ", ") + param.name + "=" + choice.ShownSetting(i);
    }
    return text;
}

std::string RandomText(const EffectOptions& options) {
    if (options.randomState) return "continuous sequence from state " + HexText(*options.randomState);
    return "seed " + std::to_string(options.seed);
}

std::string EffectText(const EffectChoice& choice) {
    std::string effect = choice.Info().name;
    if (choice.Preset()) effect += ", preset " + choice.Info().presets[*choice.Preset()];
    if (choice.Options().presetFile) effect += ", preset file " + *choice.Options().presetFile;
    if (choice.MixText() != "100") effect += ", mix " + choice.MixText();
    return Line("effect", effect) + Line("settings", SettingsText(choice)) +
           Line("random", RandomText(choice.Options()));
}

}  // namespace

SampleType SamplesOf(const RenderOptions& options, const MediaReader& reader) {
    // The matte is read from what damage does to bytes.
    if (options.isMatte) return SampleType::kBytes;
    return options.depth.value_or(SamplesFor(FactsOf(reader)));
}

std::string PlanText(const RenderOptions& options, const SectionOptions& section, const EffectList& effects,
                     const MediaReader& reader, const MediaWriter* writer, unsigned threads) {
    const MediaFacts facts = FactsOf(reader);
    std::string text = Line("input", reader.Name() + ": " + ShortText(facts));
    for (const std::string& note : NotesOn(facts)) text += Line("note", note);
    text += Line("part", SectionText(section, ClipSection::FrameCountGuess(reader, section)));
    for (const EffectChoice& choice : effects.Choices()) text += EffectText(choice);
    if (options.isMatte) text += Line("matte", "only the damage, with straight alpha");
    text += Line("depth", DepthText(SamplesOf(options, reader)));
    text += Line("threads", std::to_string(threads));
    text += Line("output", writer ? writer->Description() : "digests on standard output");
    for (const std::string& note : writer ? writer->Notes() : std::vector<std::string>())
        text += Line("note", note);
    return text;
}

}  // namespace velmora::hosts

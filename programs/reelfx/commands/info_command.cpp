#include "programs/reelfx/commands/commands.h"

#include <cstdio>
#include <nlohmann/json.hpp>

#include "programs/reelfx/media/media_facts.h"

namespace velmora::hosts {
namespace {

using Json = nlohmann::ordered_json;

Json JsonOf(const OtherStreamFacts& facts) {
    Json json = {{"kind", facts.kind}, {"codec", facts.codec}};
    if (facts.channels > 0) json["channels"] = facts.channels;
    if (facts.sampleRate > 0) json["sampleRate"] = facts.sampleRate;
    if (!facts.language.empty()) json["language"] = facts.language;
    return json;
}

Json JsonOf(const std::string& name, const MediaFacts& facts) {
    Json others = Json::array();
    for (const OtherStreamFacts& other : facts.others) others.push_back(JsonOf(other));
    Json json = {
        {"input", name},
        {"container", facts.container},
        {"codec", facts.codec},
        {"pixelFormat", facts.pixelFormat},
        {"bits", facts.bits},
        {"depth", DepthText(SamplesFor(facts))},
        {"width", facts.size.width},
        {"height", facts.size.height},
        {"turn", facts.turn},
        {"pixelShape", facts.pixelShape},
        {"rate", std::to_string(facts.rate.numerator) + "/" + std::to_string(facts.rate.denominator)},
        {"unevenRate", facts.isUnevenRate},
        {"frames", nullptr},
        {"seconds", nullptr},
        {"interlaced", facts.isInterlaced},
        {"colour",
         {{"matrix", facts.matrix},
          {"range", facts.range},
          {"primaries", facts.primaries},
          {"transfer", facts.transfer},
          {"assumedMatrix", facts.assumedMatrix}}},
        {"otherStreams", others},
        {"notes", NotesOn(facts)}};
    if (facts.frames > 0) json["frames"] = facts.frames;
    if (facts.seconds > 0.0) json["seconds"] = facts.seconds;
    return json;
}

void Line(const char* name, const std::string& text) {
    std::printf("  %-9s %s\n", name, text.c_str());
}

void Print(const std::string& name, const MediaFacts& facts) {
    std::printf("%s\n", name.c_str());
    std::string size = std::to_string(facts.size.width) + "x" + std::to_string(facts.size.height);
    if (facts.pixelShape != "1:1") size += ", pixels " + facts.pixelShape;
    Line("size", size);
    Line("rate", RateText(facts.rate) + " fps");
    Line("length",
         (facts.frames > 0 ? std::to_string(facts.frames) + " frames" : "number of frames unknown") +
             (facts.seconds > 0.0 ? ", " + NumberText(facts.seconds) + " s" : ""));
    Line("picture", facts.codec + " " + facts.pixelFormat + " in " + facts.container);
    Line("depth", std::to_string(facts.bits) + " bits, effects work in " + DepthText(SamplesFor(facts)));
    Line("colour", "matrix " + facts.matrix + ", range " + facts.range + ", primaries " + facts.primaries +
                       ", transfer " + facts.transfer);
    for (const OtherStreamFacts& other : facts.others) {
        std::string text = other.codec;
        if (other.channels > 0) text += ", " + std::to_string(other.channels) + " channels";
        if (other.sampleRate > 0) text += ", " + std::to_string(other.sampleRate) + " Hz";
        if (!other.language.empty()) text += ", " + other.language;
        Line(other.kind.c_str(), text);
    }
    for (const std::string& note : NotesOn(facts)) Line("note", note);
}

}  // namespace

ExitCode Run(const InfoOptions& options) {
    const MediaReader reader(options.input);
    const MediaFacts facts = FactsOf(reader);
    if (options.asJson) {
        // Texts in containers can have any encoding: invalid UTF-8 is replaced.
        const Json json = JsonOf(reader.Name(), facts);
        std::printf("%s\n", json.dump(2, ' ', false, Json::error_handler_t::replace).c_str());
    } else {
        Print(reader.Name(), facts);
    }
    return kExitDone;
}

}  // namespace velmora::hosts

// Prints the commands and options of reelfx as JSON, from the table that its parser uses. The man page and
// the shell completions are written from it.

#include <CLI/CLI.hpp>
#include <cstdio>
#include <nlohmann/json.hpp>

#include "programs/reelfx/commands/command_options.h"

namespace {

using Json = nlohmann::ordered_json;
using namespace velmora::hosts;

Json NamesOf(const CLI::Option& option) {
    Json names = Json::array();
    for (const std::string& name : option.get_snames()) names.push_back("-" + name);
    for (const std::string& name : option.get_lnames()) names.push_back("--" + name);
    return names;
}

Json JsonOf(const CLI::Option& option) {
    const bool takesValue = option.get_items_expected_max() > 0;
    // Checks append their text after a colon: "N:INT in [0 - 256]".
    std::string type = option.get_type_name();
    for (const char* check : {":INT", ":NONNEGATIVE"}) type = type.substr(0, type.find(check));
    return {{"names", NamesOf(option)},
            {"positional", option.get_positional() ? option.get_single_name() : ""},
            {"required", option.get_required()},
            {"value", takesValue ? type : ""},
            {"repeats", option.get_items_expected_max() > 1},
            {"default", option.get_default_str()},
            {"environment", option.get_envname()},
            {"help", option.get_description()}};
}

Json JsonOf(const CLI::App& app) {
    Json options = Json::array(), commands = Json::array();
    for (const CLI::Option* option : app.get_options({})) options.push_back(JsonOf(*option));
    for (const CLI::App* command : app.get_subcommands({})) commands.push_back(JsonOf(*command));
    return {{"name", app.get_name()},
            {"help", app.get_description()},
            {"options", options},
            {"commands", commands}};
}

}  // namespace

// NOLINTNEXTLINE(bugprone-exception-escape): an exception fails the build, as it should
int main() {
    TypedOptions typed;
    CLI::App app;
    AddCommands(app, typed);
    NameUsualCodecs(*app.get_subcommand("render"));
    Json program = JsonOf(app);
    program["version"] = velmora::kReelEffectsVersion;
    program["interrupt"] = kOnInterrupt;
    for (const ExitMeaning& exit : kExitMeanings) {
        program["exits"].push_back({{"code", static_cast<int>(exit.code)}, {"detail", exit.detail}});
    }
    std::printf("%s\n", program.dump(2).c_str());
}

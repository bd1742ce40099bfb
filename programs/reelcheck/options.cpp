#include "programs/reelcheck/options.h"

#include <algorithm>
#include <charconv>
#include <chrono>
#include <string_view>

namespace velmora::reelcheck {

const char* const kHelp =
    "reelcheck: checks that the library and the OpenFX plug-ins honour their contract with hosts,\n"
    "whatever the host does.\n"
    "\n"
    "  reelcheck [--level N] [--seed S] [--timeout SECONDS] [--only NAME]... [--json] [--library PATH]\n"
    "            [--bundle PATH]\n"
    "  reelcheck --list\n"
    "\n"
    "  --level     from 1, a quick look, to 10, everything, which takes minutes (default 5)\n"
    "  --seed      repeat the random values of an earlier run, which printed its seed\n"
    "  --timeout   seconds that one check may take before it counts as hanging (default 900)\n"
    "  --only      run this check, whatever its level; may be repeated\n"
    "  --json      print the results as one JSON object\n"
    "  --library   the library to check (Windows; default: the one beside this program)\n"
    "  --bundle    the OpenFX bundle to check (default: the one beside this program)\n"
    "  --list      print the checks with their levels\n"
    "\n"
#ifdef REELCHECK_LIBRARY
#ifndef REELCHECK_OPENFX
    "This is the 32-bit program: it checks the library. The OpenFX plug-ins need the 64-bit one.\n"
#endif
#else
    "This is the 64-bit program: it checks the OpenFX plug-ins. The library needs the 32-bit one.\n"
#endif
    "The checks run in a separate process: if the library crashes or hangs, that is a result.\n"
    "Exit codes: 0 all checks passed, 1 a check failed, 2 command line.\n";

namespace {

[[noreturn]] void Refuse(std::string_view option, const char* expected) {
    throw std::invalid_argument(std::string(option) + " takes " + expected);
}

template <typename Number>
Number NumberOf(std::string_view option, std::string_view text, Number lowest, Number highest,
                const char* expected) {
    const int base = text.starts_with("0x") ? 16 : 10;
    if (base == 16) text.remove_prefix(2);
    Number number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number, base);
    if (error != std::errc() || end != text.data() + text.size() || number < lowest || number > highest) {
        Refuse(option, expected);
    }
    return number;
}

std::uint64_t SeedFromClock() {
    const auto ticks = std::chrono::system_clock::now().time_since_epoch().count();
    return Dice(static_cast<std::uint64_t>(ticks), "seed").Word();
}

class Arguments {
  public:
    Arguments(int count, char** arguments) : m_next(arguments + 1), m_end(arguments + count) {}

    [[nodiscard]] bool AtEnd() const { return m_next >= m_end; }
    std::string_view Name() { return m_name = *m_next++; }
    std::string_view Value(const char* expected) {
        if (AtEnd()) Refuse(m_name, expected);
        return *m_next++;
    }

  private:
    char** m_next;
    char** m_end;
    std::string_view m_name;
};

}  // namespace

Options ReadOptions(int count, char** arguments) {
    Options options;
    options.seed = SeedFromClock();
    Arguments reader(count, arguments);
    while (!reader.AtEnd()) {
        const std::string_view name = reader.Name();
        const auto number = [&]<typename Number>(Number lowest, Number highest, const char* expected) {
            return NumberOf(name, reader.Value(expected), lowest, highest, expected);
        };
        if (name == "--help" || name == "-h") {
            options.help = true;
        } else if (name == "--list") {
            options.list = true;
        } else if (name == "--json") {
            options.json = true;
        } else if (name == "--level") {
            options.level = number(kLowestLevel, kHighestLevel, "a number from 1 to 10");
        } else if (name == "--seed") {
            options.seed = number(std::uint64_t{0}, ~std::uint64_t{0}, "a number");
        } else if (name == "--timeout") {
            options.timeoutSeconds = number(1, 86400, "seconds from 1 to 86400");
        } else if (name == "--only") {
            options.only.emplace_back(reader.Value("a check's name"));
        } else if (name == "--library") {
            options.library = reader.Value("a path");
#ifndef REELCHECK_LIBRARY
            throw std::invalid_argument(
                "the library is a 32-bit module, which this 64-bit program cannot load");
#endif
        } else if (name == "--bundle") {
            options.bundle = reader.Value("a path");
#ifndef REELCHECK_OPENFX
            throw std::invalid_argument(
                "OpenFX plug-ins are 64-bit modules, which this 32-bit program cannot load");
#endif
        } else if (name == "--child") {
            options.childFrom = number(0, 1000, "a position");
        } else {
            throw std::invalid_argument("unknown option " + std::string(name) + ", see --help");
        }
    }
    return options;
}

std::vector<std::string> ChildArguments(const Options& options, int position) {
    std::vector<std::string> arguments = {
        "--child", std::to_string(position),     "--level",   std::to_string(options.level),
        "--seed",  std::to_string(options.seed), "--timeout", std::to_string(options.timeoutSeconds)};
    for (const std::string& name : options.only) arguments.insert(arguments.end(), {"--only", name});
    if (!options.library.empty()) arguments.insert(arguments.end(), {"--library", options.library});
    if (!options.bundle.empty()) arguments.insert(arguments.end(), {"--bundle", options.bundle});
    return arguments;
}

std::vector<const Check*> ChosenChecks(const Options& options) {
    std::vector<const Check*> chosen;
    for (const std::string& name : options.only) {
        if (std::ranges::none_of(AllChecks(), [&](const Check& check) { return name == check.name; })) {
            throw std::invalid_argument("there is no check " + name + ", see --list");
        }
    }
    for (const Check& check : AllChecks()) {
        const bool isNamed = std::ranges::find(options.only, check.name) != options.only.end();
        if (isNamed || (options.only.empty() && check.level <= options.level)) chosen.push_back(&check);
    }
    return chosen;
}

}  // namespace velmora::reelcheck

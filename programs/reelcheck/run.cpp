#include "programs/reelcheck/options.h"

#include <algorithm>
#include <chrono>
#include <cinttypes>
#include <cstdio>
#include <cstdlib>
#include <string_view>
#include <utility>

#include "programs/reelcheck/child_process.h"

namespace velmora::reelcheck {
namespace {

struct Result {
    const Check* check;
    bool passed = false;
    double seconds = 0;
    std::string text;  // for a failure
};

void PrintResult(const Result& result) {
    std::printf("%s %2d  %-24s %8.2f s%s%s\n", result.passed ? "ok    " : "FAILED", result.check->level,
                result.check->name, result.seconds, result.text.empty() ? "" : "  ", result.text.c_str());
    std::fflush(stdout);
}

std::string JsonText(std::string_view text) {
    std::string quoted = "\"";
    for (const char letter : text) {
        if (letter == '"' || letter == '\\') quoted += '\\';
        quoted += static_cast<unsigned char>(letter) < 0x20 ? ' ' : letter;
    }
    return quoted + '"';
}

void PrintJson(const Options& options, const std::vector<Result>& results, int failures, double seconds) {
    std::printf("{\n  \"level\": %d,\n  \"seed\": \"0x%" PRIX64 "\",\n  \"checks\": [\n", options.level,
                options.seed);
    for (const Result& result : results) {
        std::printf("    {\"name\": %s, \"level\": %d, \"passed\": %s, \"seconds\": %.3f, \"text\": %s}%s\n",
                    JsonText(result.check->name).c_str(), result.check->level,
                    result.passed ? "true" : "false", result.seconds, JsonText(result.text).c_str(),
                    &result == &results.back() ? "" : ",");
    }
    std::printf("  ],\n  \"failures\": %d,\n  \"seconds\": %.1f\n}\n", failures, seconds);
}

// Follows children through the checks. A child that dies fails its check, and the next child runs the rest.
class Follower {
  public:
    Follower(const Options& options, const std::vector<const Check*>& checks)
        : m_options(options), m_checks(checks) {}

    std::vector<Result> FollowAll() {
        while (m_results.size() < m_checks.size()) FollowOneChild();
        return std::move(m_results);
    }

  private:
    void FollowOneChild() {
        const std::size_t first = m_results.size();
        ChildProcess child(ChildArguments(m_options, static_cast<int>(first)));
        std::string line, crash;
        auto read = ChildProcess::Read::kLine;
        // The child has its own time limit; this one is for a child that can no longer enforce it.
        while ((read = child.ReadLine(line, m_options.timeoutSeconds + 10.0)) == ChildProcess::Read::kLine) {
            TakeLine(line, crash);
        }
        if (read == ChildProcess::Read::kTimeout) {
            child.Kill();
            crash = "does not answer";
        }
        const std::string ended = child.HowItEnded();
        if (crash.empty()) crash = "the process ended, " + (ended.empty() ? "too early" : ended);
        if (m_results.size() < m_checks.size()) {
            Add({m_checks[m_results.size()], false, 0.0, crash});
        } else if (!ended.empty()) {
            // After the last check: this is when a leak detector reports.
            m_results.back().passed = false;
            m_results.back().text = crash;
            if (!m_options.json) PrintResult(m_results.back());
        }
    }

    void TakeLine(std::string_view line, std::string& crash) {
        const auto rest = [&line](std::string_view word) {
            if (!line.starts_with(word)) return std::string();
            return std::string(line.substr(word.size()));
        };
        if (line.starts_with("crash ")) {
            crash = rest("crash ");
        } else if (m_results.size() < m_checks.size() &&
                   (line.starts_with("ok ") || line.starts_with("failed "))) {
            const bool passed = line.starts_with("ok ");
            const std::string told = rest(passed ? "ok " : "failed ");
            char* end = nullptr;
            const double seconds = std::strtod(told.c_str(), &end);
            Add({m_checks[m_results.size()], passed, seconds, *end == ' ' ? end + 1 : end});
        }
    }

    void Add(Result result) {
        m_results.push_back(std::move(result));
        if (!m_options.json) PrintResult(m_results.back());
    }

    const Options& m_options;
    const std::vector<const Check*>& m_checks;
    std::vector<Result> m_results;
};

}  // namespace

bool RunChecks(const Options& options) {
    const std::vector<const Check*> checks = ChosenChecks(options);
    const auto start = std::chrono::steady_clock::now();
    if (!options.json) {
        std::printf("reelcheck: level %d, seed 0x%" PRIX64 "\n", options.level, options.seed);
        std::fflush(stdout);
    }
    const std::vector<Result> results = Follower(options, checks).FollowAll();
    const double seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    const auto failures = static_cast<int>(std::ranges::count(results, false, &Result::passed));
    if (options.json) {
        PrintJson(options, results, failures, seconds);
    } else {
        std::printf("reelcheck: level %d, %d checks, %d failures, %.0f s, seed 0x%" PRIX64 "\n",
                    options.level, static_cast<int>(results.size()), failures, seconds, options.seed);
    }
    return failures == 0;
}

}  // namespace velmora::reelcheck

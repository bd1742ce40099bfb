#include "programs/common/level_times.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>

#include "effects/render_session.h"

namespace velmora::bench {
namespace {

using render::SimdLevel;

std::vector<std::string_view> LevelsHere() {
    std::vector<std::string_view> names;
    for (const SimdLevel level :
         {SimdLevel::kAvx2, SimdLevel::kSsse3, SimdLevel::kSse2, SimdLevel::kAvx512}) {
        if (level <= render::BestSimdLevel()) names.push_back(NameOf(level));
    }
    if (names.empty()) names.push_back(NameOf(SimdLevel::kPlain));
    return names;
}

}  // namespace

const std::vector<std::string_view>& MeasuredLevels() {
    static const std::vector<std::string_view> levels = LevelsHere();
    return levels;
}

void SetLevel(std::string_view name) {
    const std::string value(name);
#ifdef _WIN32
    _putenv_s(kSimdVariable, value.c_str());
#else
    setenv(kSimdVariable, value.c_str(), 1);
#endif
}

double LevelTimes::Typical(std::vector<double> values) {
    if (values.empty()) return 0;
    const auto at = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 4);
    std::nth_element(values.begin(), at, values.end());
    return *at;
}

void PrintTableHead() {
    std::string head = "| case | ms, " + std::string(MeasuredLevels().front()) + " |", line = "|---|---|";
    for (const std::string_view level : MeasuredLevels()) {
        head += " " + std::string(level) + " |";
        line += "---|";
    }
    std::printf("%s\n%s\n", head.c_str(), line.c_str());
}

void PrintTableRow(const std::string& name, const LevelTimes& times) {
    std::printf("| %s | %.2f |", name.c_str(), 1000 * times.Work(0));
    for (std::size_t level = 0; level < MeasuredLevels().size(); ++level) {
        std::printf(" %.2f |", times.Work(level) / times.Copy());
    }
    std::printf("\n");
    std::fflush(stdout);
}

}  // namespace velmora::bench

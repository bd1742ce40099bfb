#include "faces/frei0r/host_time_unit.h"

#include <algorithm>
#include <array>

#include "text/names.h"

namespace velmora::hosts::frei0r {
namespace {

struct KnownModule {
    std::string_view part;  // of the file name, in lower case
    TimeUnit unit;
};

constexpr std::array<KnownModule, 6> kKnownModules = {{
    {"avfilter", TimeUnit::kMilliseconds},
    {"ffmpeg", TimeUnit::kMilliseconds},
    {"ffplay", TimeUnit::kMilliseconds},
    {"ffprobe", TimeUnit::kMilliseconds},
    {"mltfrei0r", TimeUnit::kSeconds},
    {"gstfrei0r", TimeUnit::kSeconds},
}};

}  // namespace

TimeUnit UnitOfModule(std::string_view fileName) {
    if (const auto slash = fileName.find_last_of("/\\"); slash != std::string_view::npos) {
        fileName.remove_prefix(slash + 1);
    }
    std::string lower(fileName);
    std::ranges::transform(lower, lower.begin(), ToLower);
    for (const KnownModule& known : kKnownModules) {
        if (lower.find(known.part) != std::string::npos) return known.unit;
    }
    return TimeUnit::kUnknown;
}

}  // namespace velmora::hosts::frei0r

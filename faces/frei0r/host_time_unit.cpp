#include "faces/frei0r/host_time_unit.h"

#include <array>

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
    for (char& c : lower) {
        if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
    }
    for (const KnownModule& known : kKnownModules) {
        if (lower.find(known.part) != std::string::npos) return known.unit;
    }
    return TimeUnit::kUnknown;
}

}  // namespace velmora::hosts::frei0r

#include "effects/render_options.h"

#include <algorithm>
#include <cstdlib>
#include <string_view>

namespace velmora {
namespace {

struct NamedLevel {
    std::string_view name;
    render::SimdLevel level;
};
constexpr NamedLevel kLevels[] = {
    {"plain", render::SimdLevel::kPlain},   {"sse2", render::SimdLevel::kSse2},
    {"ssse3", render::SimdLevel::kSsse3},   {"avx2", render::SimdLevel::kAvx2},
    {"avx512", render::SimdLevel::kAvx512},
};

std::string_view Variable(const char* name) noexcept {
    const char* value = std::getenv(name);
    return value == nullptr ? std::string_view() : std::string_view(value);
}

}  // namespace

std::string_view NameOf(render::SimdLevel level) noexcept {
    for (const NamedLevel& named : kLevels) {
        if (named.level == level) return named.name;
    }
    return {};
}

render::RenderOptions ReadRenderOptions() noexcept {
    render::RenderOptions options;
    const std::string_view wanted = Variable(kSimdVariable);
    for (const NamedLevel& named : kLevels) {
        if (named.name == wanted) options.level = std::min(options.level, named.level);
    }
    return options;
}

}  // namespace velmora

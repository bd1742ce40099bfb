#include "effects/render_options.h"

#include <algorithm>
#include <cstdlib>
#include <string_view>

namespace velmora {
namespace {

struct NamedForm {
    std::string_view name;
    render::Form form;
};
constexpr NamedForm kForms[] = {
    {"plain", render::Form::kPlain},
    {"sse2", render::Form::kSse2},
    {"avx2", render::Form::kAvx2},
    {"avx512", render::Form::kAvx512},
};

std::string_view Variable(const char* name) noexcept {
    const char* value = std::getenv(name);
    return value == nullptr ? std::string_view() : std::string_view(value);
}

}  // namespace

render::RenderOptions ReadRenderOptions() noexcept {
    render::RenderOptions options;
    const std::string_view wanted = Variable("VELMORA_FORM");
    for (const NamedForm& named : kForms) {
        if (named.name == wanted) options.form = std::min(options.form, named.form);
    }
#if defined(VELMORA_PLAIN_ROAD)
    options.road = render::Road::kByStages;
#else
    if (Variable("VELMORA_ROAD") == "stages") options.road = render::Road::kByStages;
#endif
    return options;
}

}  // namespace velmora

// The functions of a frei0r plug-in. Compiled once for each effect, whose table is VELMORA_FREI0R_EFFECT.
// Only constant descriptions are shared; everything that changes is in the instances.

#include <cinttypes>

// The header declares C functions without linkage and visibility.
#pragma GCC visibility push(default)
extern "C" {
#include <frei0r.h>
}
#pragma GCC visibility pop

#include <cstddef>
#include <exception>
#include <new>

#include "faces/frei0r/instance.h"
#include "platform/platform.h"

namespace {

using velmora::hosts::frei0r::Instance;
using velmora::hosts::frei0r::PluginDescription;
using velmora::hosts::frei0r::UnitOfModule;

const PluginDescription& Plugin() {
    static const PluginDescription plugin =
        velmora::hosts::frei0r::DescribePlugin(velmora::effects::VELMORA_FREI0R_EFFECT);
    return plugin;
}

// No exception may reach a host. Only allocating a few names can throw.
template <class Action>
void Guarded(Action action) noexcept {
    try {
        action();
    } catch (const std::exception&) {
    }
}

}  // namespace

extern "C" {

// To FFmpeg a negative result means failure, to GStreamer zero.
int f0r_init() {
    return 1;
}

void f0r_deinit() {}

void f0r_get_plugin_info(f0r_plugin_info_t* info) {
    Guarded([&] {
        *info = {.name = Plugin().name.c_str(),
                 .author = "Velmora",
                 .plugin_type = F0R_PLUGIN_TYPE_FILTER,
                 .color_model = F0R_COLOR_MODEL_RGBA8888,
                 .frei0r_version = FREI0R_MAJOR_VERSION,
                 .major_version = velmora::kReelEffectsMajor,
                 .minor_version = velmora::kReelEffectsMinor,
                 .num_params = static_cast<int>(Plugin().params.size()),
                 .explanation = Plugin().explanation.c_str()};
    });
}

void f0r_get_param_info(f0r_param_info_t* info, int index) {
    Guarded([&] {
        const auto i = static_cast<std::size_t>(index);
        if (i >= Plugin().params.size()) return;
        const auto& param = Plugin().params[i];
        *info = {param.name.c_str(), param.type, param.explanation.c_str()};
    });
}

f0r_instance_t f0r_construct(unsigned int width, unsigned int height) {
    const void* caller = __builtin_return_address(0);
    f0r_instance_t instance = nullptr;
    Guarded([&] {
        if (width == 0 || height == 0) return;
        instance = new Instance(Plugin(), width, height, UnitOfModule(velmora::support::ModuleAt(caller)));
    });
    return instance;
}

void f0r_destruct(f0r_instance_t instance) {
    delete static_cast<Instance*>(instance);
}

void f0r_set_param_value(f0r_instance_t instance, f0r_param_t param, int index) {
    Guarded([&] { static_cast<Instance*>(instance)->Set(index, param); });
}

void f0r_get_param_value(f0r_instance_t instance, f0r_param_t param, int index) {
    Guarded([&] { static_cast<Instance*>(instance)->Get(index, param); });
}

void f0r_update(f0r_instance_t instance, double time, const uint32_t* in, uint32_t* out) {
    static_cast<Instance*>(instance)->Update(time, in, out);
}

}  // extern "C"

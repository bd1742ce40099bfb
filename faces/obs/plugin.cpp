// The module that OBS loads: five filters, one for each effect.
#include <obs-module.h>

#include <exception>
#include <vector>

#include "effects/effect_table.h"
#include "faces/obs/film_filter.h"
#include "faces/obs/filter_settings.h"

OBS_DECLARE_MODULE()
OBS_MODULE_USE_DEFAULT_LOCALE("velmora-reel-effects-obs", "en-US")
OBS_MODULE_AUTHOR("Velmora")

namespace velmora::hosts::obs {
namespace {

const std::vector<FilterDescription>& Filters() {
    static const std::vector<FilterDescription> filters = [] {
        std::vector<FilterDescription> all;
        for (std::uint32_t i = 0; i < effects::kAllEffects.size(); ++i) all.push_back(DescribeFilter(i));
        return all;
    }();
    return filters;
}

const FilterDescription& Described(void* typeData) {
    return *static_cast<const FilterDescription*>(typeData);
}

FilmFilter& FilterOf(void* data) {
    return *static_cast<FilmFilter*>(data);
}

// No exception may reach OBS. Only allocating can throw.
template <class Action>
void Guarded(Action action) noexcept {
    try {
        action();
    } catch (const std::exception& error) {
        blog(LOG_WARNING, "Velmora Reel Effects: %s", error.what());
    }
}

void* Create(obs_data_t* settings, obs_source_t* source) {
    FilmFilter* filter = nullptr;
    Guarded([&] {
        auto made = std::make_unique<FilmFilter>(Described(obs_source_get_type_data(source)), source);
        made->Update(settings);
        filter = made.release();
    });
    return filter;
}

obs_properties_t* Properties(void* data, void* typeData) {
    obs_properties_t* properties = nullptr;
    Guarded([&] {
        obs_source_t* source = data == nullptr ? nullptr : FilterOf(data).Source();
        properties = MakePanel(Described(typeData), source);
    });
    return properties;
}

obs_source_info InfoOf(const FilterDescription& filter) {
    obs_source_info info{};
    info.id = filter.id.c_str();
    info.type = OBS_SOURCE_TYPE_FILTER;
    info.output_flags = OBS_SOURCE_VIDEO | OBS_SOURCE_SRGB;
    info.type_data = const_cast<FilterDescription*>(&filter);
    info.get_name = [](void* typeData) { return Described(typeData).name.c_str(); };
    info.create = Create;
    info.destroy = [](void* data) { delete static_cast<FilmFilter*>(data); };
    info.get_defaults2 = [](void* typeData, obs_data_t* settings) {
        Guarded([&] { SetDefaults(Described(typeData), settings); });
    };
    info.get_properties2 = Properties;
    info.update = [](void* data, obs_data_t* settings) { Guarded([&] { FilterOf(data).Update(settings); }); };
    info.video_tick = [](void* data, float) { FilterOf(data).Tick(); };
    info.video_render = [](void* data, gs_effect_t*) { Guarded([&] { FilterOf(data).Draw(); }); };
    return info;
}

}  // namespace

// Locale files are read line by line as KEY="text", so keys have letters and digits only.
const char* Text(const char* english) {
    std::string key;
    for (const char* c = english; *c != 0; ++c) {
        const bool isPlain = (*c >= 'A' && *c <= 'Z') || (*c >= 'a' && *c <= 'z') || (*c >= '0' && *c <= '9');
        if (isPlain) key += *c;
    }
    const char* text = english;
    return obs_module_get_string(key.c_str(), &text) ? text : english;
}

}  // namespace velmora::hosts::obs

const char* obs_module_name() {
    return "Velmora Reel Effects";
}

const char* obs_module_description() {
    return "The look of old film, with the same result in every host";
}

bool obs_module_load() {
    using namespace velmora::hosts::obs;
    bool isLoaded = false;
    Guarded([&] {
        for (const FilterDescription& filter : Filters()) {
            const obs_source_info info = InfoOf(filter);
            obs_register_source(&info);
        }
        isLoaded = true;
    });
    return isLoaded;
}

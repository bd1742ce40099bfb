#include "faces/obs/filter_settings.h"

#include <limits>
#include <memory>
#include <random>
#include <string>

#include "effects/effect_queries.h"

namespace velmora::hosts::obs {
namespace {

// What the panel's actions work on. Belongs to the properties.
struct Panel {
    const FilterDescription& filter;
    obs_weak_source_t* source;
};

struct SourceRelease {
    void operator()(obs_source_t* source) const noexcept { obs_source_release(source); }
};

Panel& PanelOf(void* action) {
    return *static_cast<Panel*>(action);
}

void DestroyPanel(void* param) {
    const std::unique_ptr<Panel> panel(static_cast<Panel*>(param));
    obs_weak_source_release(panel->source);
}

// OBS takes over a control's own change; the other settings that an action changes need this.
void TakeOver(const Panel& panel) {
    const std::unique_ptr<obs_source_t, SourceRelease> source(obs_weak_source_get_source(panel.source));
    if (source != nullptr) obs_source_update(source.get(), nullptr);
}

void ShowMessage(obs_properties_t* properties, const char* english, obs_text_info_type type) {
    obs_property_t* message = obs_properties_get(properties, kMessageKey);
    obs_property_set_description(message, Text(english));
    obs_property_text_set_info_type(message, type);
    obs_property_set_visible(message, true);
}

// Actions return whether the panel is to be drawn again. OBS also runs them all when it opens the panel.

bool OnPreset(void* action, obs_properties_t*, obs_property_t*, obs_data_t* settings) {
    if (!WriteChosenPreset(PanelOf(action).filter, settings)) return false;
    TakeOver(PanelOf(action));
    return true;
}

// The list of presets is not drawn again here, because that would take the slider out of the user's hand.
bool OnValue(void* action, obs_properties_t*, obs_property_t*, obs_data_t* settings) {
    DropPresetIfChanged(PanelOf(action).filter, settings);
    return false;
}

bool OnLoad(void* action, obs_properties_t* properties, obs_property_t*, obs_data_t* settings) {
    const std::string path = obs_data_get_string(settings, kLoadPresetKey);
    if (path.empty()) return false;
    obs_data_set_string(settings, kLoadPresetKey, "");
    if (LoadPresetFile(PanelOf(action).filter, path, settings)) {
        obs_property_set_visible(obs_properties_get(properties, kMessageKey), false);
        TakeOver(PanelOf(action));
    } else {
        ShowMessage(properties, "This is not a preset file of this effect.", OBS_TEXT_INFO_WARNING);
    }
    return true;
}

bool OnSave(void* action, obs_properties_t* properties, obs_property_t*, obs_data_t* settings) {
    const std::string path = obs_data_get_string(settings, kSavePresetKey);
    if (path.empty()) return false;
    obs_data_set_string(settings, kSavePresetKey, "");
    if (SavePresetFile(PanelOf(action).filter, path, settings)) {
        ShowMessage(properties, "The preset file was saved.", OBS_TEXT_INFO_NORMAL);
    } else {
        ShowMessage(properties, "The preset file could not be written.", OBS_TEXT_INFO_WARNING);
    }
    return true;
}

bool OnNewSeed(obs_properties_t*, obs_property_t*, void* action) {
    const Panel& panel = PanelOf(action);
    const std::unique_ptr<obs_source_t, SourceRelease> source(obs_weak_source_get_source(panel.source));
    if (source == nullptr) return false;
    std::random_device device;
    std::uniform_int_distribution<int> seeds(1, std::numeric_limits<int>::max());
    obs_data_t* settings = obs_source_get_settings(source.get());
    obs_data_set_int(settings, kSeedKey, seeds(device));
    obs_data_release(settings);
    obs_source_update(source.get(), nullptr);
    return true;
}

void AddPresets(obs_properties_t* properties, Panel* panel) {
    obs_property_t* list = obs_properties_add_list(properties, kPresetKey, Text("Preset"),
                                                   OBS_COMBO_TYPE_LIST, OBS_COMBO_FORMAT_STRING);
    obs_property_list_add_string(list, Text("Custom settings"), "");
    for (const char* name : panel->filter.effect.presetNames) obs_property_list_add_string(list, name, name);
    obs_property_set_modified_callback2(list, OnPreset, panel);
}

void AddSlider(obs_properties_t* properties, const effects::ParamRow& row, const char* key,
               const char* label) {
    constexpr float kPercent = 100.0f;
    const bool isPercent = row.maximum >= kPercent;
    obs_property_t* slider = obs_properties_add_float_slider(properties, key, label, double{row.minimum},
                                                             double{row.maximum}, isPercent ? 0.1 : 0.01);
    if (isPercent) obs_property_float_set_suffix(slider, " %");
}

void AddMenu(obs_properties_t* properties, const effects::ParamRow& row, const char* key, const char* label) {
    obs_property_t* menu =
        obs_properties_add_list(properties, key, label, OBS_COMBO_TYPE_LIST, OBS_COMBO_FORMAT_STRING);
    for (const char* item : row.items) obs_property_list_add_string(menu, Text(item), item);
}

void AddParam(obs_properties_t* properties, Panel* panel, std::size_t param) {
    const effects::ParamRow& row = panel->filter.effect.params[param];
    const char* key = panel->filter.keys[param].c_str();
    const char* label = Text(panel->filter.names[param]);
    if (row.kind == kKindSlider) {
        AddSlider(properties, row, key, label);
    } else if (row.kind == kKindColour) {
        obs_properties_add_color(properties, key, label);
    } else if (row.kind == kKindCheckBox) {
        obs_properties_add_bool(properties, key, label);
    } else if (row.kind == kKindMenu) {
        AddMenu(properties, row, key, label);
    }
    obs_property_set_modified_callback2(obs_properties_get(properties, key), OnValue, panel);
}

// Groups do not lie within groups.
void AddParams(obs_properties_t* properties, Panel* panel) {
    const auto& rows = panel->filter.effect.params;
    obs_properties_t* place = properties;
    for (std::size_t i = 0; i < rows.size(); ++i) {
        if (effects::HoldsValue(rows[i])) {
            AddParam(place, panel, i);
        } else if (rows[i].isGroupEnd) {
            place = properties;
        } else {
            place = obs_properties_create();
            const std::string key = "group_" + effects::IdentifierOf(rows[i].name);
            obs_properties_add_group(properties, key.c_str(), Text(rows[i].name), OBS_GROUP_NORMAL, place);
        }
    }
}

void AddSeedAndTime(obs_properties_t* properties, Panel* panel) {
    obs_properties_add_int(properties, kSeedKey, Text("Seed"), 0, std::numeric_limits<int>::max(), 1);
    obs_properties_add_button2(properties, kNewSeedKey, Text("New seed"), OnNewSeed, panel);
    obs_property_t* time =
        obs_properties_add_bool(properties, kSourceTimeKey, Text("Follow the source's time"));
    obs_property_set_long_description(time, Text("Damage follows the position of a film and stops with it. "
                                                 "With other sources it follows the clock."));
}

void AddPresetFiles(obs_properties_t* properties, Panel* panel) {
    const std::string extension = PresetFileExtension(panel->filter);
    const std::string files = std::string(Text("Preset Files")) + " (*." + extension + ")";
    const struct {
        const char* key;
        const char* name;
        obs_path_type type;
        obs_property_modified2_t action;
    } paths[] = {
        {kLoadPresetKey, "Load preset file", OBS_PATH_FILE, OnLoad},
        {kSavePresetKey, "Save preset file", OBS_PATH_FILE_SAVE, OnSave},
    };
    for (const auto& path : paths) {
        obs_property_t* field =
            obs_properties_add_path(properties, path.key, Text(path.name), path.type, files.c_str(), nullptr);
        obs_property_set_modified_callback2(field, path.action, panel);
    }
    obs_property_t* message = obs_properties_add_text(properties, kMessageKey, "", OBS_TEXT_INFO);
    obs_property_set_visible(message, false);
}

}  // namespace

obs_properties_t* MakePanel(const FilterDescription& filter, obs_source_t* source) {
    std::unique_ptr<Panel> panel(new Panel{filter, obs_source_get_weak_source(source)});
    Panel* actions = panel.get();
    obs_properties_t* properties = obs_properties_create_param(panel.release(), DestroyPanel);
    AddPresets(properties, actions);
    AddParams(properties, actions);
    AddSeedAndTime(properties, actions);
    AddPresetFiles(properties, actions);
    return properties;
}

}  // namespace velmora::hosts::obs

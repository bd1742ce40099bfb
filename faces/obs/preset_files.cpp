#include "faces/obs/filter_settings.h"

#include <algorithm>
#include <filesystem>
#include <vector>

#include "effects/effect_queries.h"
#include "user_presets/dialogs.h"
#include "user_presets/file_access.h"
#include "user_presets/preset_file.h"

namespace velmora::hosts::obs {
namespace {

std::filesystem::path PathOf(const std::string& utf8) {
    return std::u8string(utf8.begin(), utf8.end());
}

std::string Utf8Of(const std::filesystem::path& path) {
    const std::u8string text = path.u8string();
    return {text.begin(), text.end()};
}

void FillField(char (&field)[kPresetNameWidth], const std::string& text) {
    const std::size_t length = std::min<std::size_t>(text.size(), kPresetNameWidth - 1);
    std::fill(std::copy_n(text.data(), length, field), field + kPresetNameWidth, '\0');
}

}  // namespace

std::string PresetFileExtension(const FilterDescription& filter) {
    const PresetExtension wide = MakePresetExtension(kLibraryName, filter.index);
    std::string extension;
    for (const char16_t* c = wide.data(); *c != 0; ++c) extension += static_cast<char>(*c);
    return extension;
}

bool LoadPresetFile(const FilterDescription& filter, const std::string& path, obs_data_t* settings) {
    const auto name = FileNameFromUtf8(path);
    PresetRecord record{};
    std::vector<std::uint32_t> kinds;
    for (const effects::ParamRow& row : filter.effect.params) kinds.push_back(row.kind);
    if (!name || !ReadPreset(name->c_str(), &record) ||
        !IsCompatible(kLibraryName, filter.effect.name, kinds, &record)) {
        return false;
    }
    obs_data_set_string(settings, kPresetKey, "");
    obs_data_set_string(settings, kAppliedPresetKey, "");
    for (std::uint32_t i = 0; i < kinds.size(); ++i) WriteValue(filter, i, record.values[i].value, settings);
    return true;
}

bool SavePresetFile(const FilterDescription& filter, const std::string& path, obs_data_t* settings) {
    std::filesystem::path place = PathOf(path);
    const std::string extension = "." + PresetFileExtension(filter);
    if (place.extension() != extension) place += extension;
    const auto name = FileNameFromUtf8(Utf8Of(place));
    const auto title = FileNameFromUtf8(Utf8Of(place.stem()));
    if (!name || !title) return false;
    PresetRecord record{};
    FillField(record.name, *title);
    FillField(record.libraryName, kLibraryName);
    FillField(record.effectName, filter.effect.name);
    const FilterValues values = ReadValues(filter, settings);
    record.count = static_cast<std::int32_t>(values.own.size());
    for (std::size_t i = 0; i < values.own.size(); ++i) {
        record.values[i] = {values.own[i], 0, filter.effect.params[i].kind};
    }
    return WritePreset(name->c_str(), &record);
}

}  // namespace velmora::hosts::obs

#include <tinyxml.h>

#include <algorithm>
#include <exception>
#include <memory>
#include <string>

#include "presets/file_access.h"
#include "presets/number_text.h"
#include "presets/preset_file.h"

namespace velmora {

namespace {

// The declaration's odd form belongs to the document: it is printed in the usual one.
constexpr const char* kTemplate =
    "<?xml version=\"1.0\"  standalone='no' >\n"
    "<!-- Effect's Preset File -->\n"
    "<Preset>\n"
    "</Preset>";

void SetName(TiXmlElement& preset, const char* attribute, const char (&field)[kPresetNameWidth]) {
    preset.SetAttribute(attribute, std::string(field, std::find(field, field + kPresetNameWidth, '\0')));
}

// Values are given to the XML library as text: its own conversion follows the locale.
void SetValue(TiXmlElement& parameter, const ValueCell& cell) {
    switch (cell.kind) {
        case kKindNone:
            parameter.SetAttribute(std::string("x"), FormatNumber(double{cell.value.number}));
            parameter.SetAttribute(std::string("y"),
                                   FormatNumber(double{ValueWord{.bits = cell.second}.number}));
            break;
        case kKindMenu:
        case kKindColour:
            parameter.SetAttribute(std::string("value"), FormatInteger(cell.value.item));
            break;
        case kKindSlider:
            parameter.SetAttribute(std::string("value"), FormatNumber(double{cell.value.number}));
            break;
        case kKindCheckBox:
            parameter.SetAttribute("value", cell.value.flag != 0 ? "1" : "0");
            break;
        default:
            break;
    }
}

void AppendParameter(TiXmlElement& preset, const ValueCell& cell) {
    auto parameter = std::make_unique<TiXmlElement>("parameter");
    parameter->SetAttribute(std::string("type"), FormatInteger(static_cast<std::int32_t>(cell.kind)));
    SetValue(*parameter, cell);
    preset.LinkEndChild(parameter.release());
}

bool WriteDocument(const char* fileName, const PresetRecord& record) {
    TiXmlDocument document;
    document.Parse(kTemplate, nullptr, TIXML_ENCODING_LEGACY);
    TiXmlElement* preset = document.FirstChildElement("Preset");
    if (preset == nullptr) return false;
    SetName(*preset, "Name", record.name);
    SetName(*preset, "LibraryName", record.libraryName);
    SetName(*preset, "EffectName", record.effectName);
    const std::int32_t count = std::clamp(record.count, 0, kPresetCellCapacity);
    std::for_each_n(record.values, count, [&](const ValueCell& cell) { AppendParameter(*preset, cell); });
    return ReplaceTextFile(fileName, [&](std::FILE* file) { return document.SaveFile(file); });
}

}  // namespace

bool WritePreset(const char* fileName, const PresetRecord* record) noexcept {
    if (fileName == nullptr || record == nullptr) return false;
    try {
        return WriteDocument(fileName, *record);
    } catch (const std::exception&) {  // memory is short
        return false;
    }
}

}  // namespace velmora

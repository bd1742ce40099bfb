#include <tinyxml.h>

#include <algorithm>
#include <exception>
#include <memory>
#include <string>

#include "user_presets/file_access.h"
#include "text/number_text.h"
#include "user_presets/preset_file.h"

namespace velmora {

namespace {

// Appends a new child to a node, which then owns it. Returns the child.
template <typename Node, typename... Arguments>
Node& Append(TiXmlNode& parent, const Arguments&... arguments) {
    auto child = std::make_unique<Node>(arguments...);
    Node& added = *child;
    parent.LinkEndChild(child.release());
    return added;
}

void SetName(TiXmlElement& preset, const char* attribute, const char (&field)[kPresetNameWidth]) {
    preset.SetAttribute(attribute, std::string(field, std::find(field, field + kPresetNameWidth, '\0')));
}

// Values are passed to the XML library as text: its own conversion follows the locale.
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
    auto& parameter = Append<TiXmlElement>(preset, "parameter");
    parameter.SetAttribute(std::string("type"), FormatInteger(static_cast<std::int32_t>(cell.kind)));
    SetValue(parameter, cell);
}

bool WriteDocument(const char* fileName, const PresetRecord& record) {
    TiXmlDocument document;
    Append<TiXmlDeclaration>(document, "1.0", "", "no");
    Append<TiXmlComment>(document, " Effect's Preset File ");
    auto& preset = Append<TiXmlElement>(document, "Preset");
    SetName(preset, "Name", record.name);
    SetName(preset, "LibraryName", record.libraryName);
    SetName(preset, "EffectName", record.effectName);
    const std::int32_t count = std::clamp(record.count, 0, kPresetCellCapacity);
    std::for_each_n(record.values, count, [&](const ValueCell& cell) { AppendParameter(preset, cell); });
    return ReplaceTextFile(fileName, [&](std::FILE* file) { return document.SaveFile(file); });
}

}  // namespace

bool WritePreset(const char* fileName, const PresetRecord* record) noexcept {
    if (fileName == nullptr || record == nullptr) return false;
    try {
        return WriteDocument(fileName, *record);
    } catch (const std::exception&) {  // not enough memory
        return false;
    }
}

}  // namespace velmora

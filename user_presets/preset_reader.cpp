#include <tinyxml.h>

#include <algorithm>
#include <cstring>
#include <exception>
#include <string>

#include "user_presets/file_access.h"
#include "text/number_text.h"
#include "user_presets/preset_file.h"

namespace velmora {

namespace {

bool ReadInteger(const TiXmlElement& element, const char* attribute, std::int32_t* value) {
    const char* text = element.Attribute(attribute);
    return text != nullptr && ParseInteger(text, value);
}

// Leaves the word unchanged when there is no number.
void ReadNumber(const TiXmlElement& element, const char* attribute, std::uint32_t* word) {
    const char* text = element.Attribute(attribute);
    double value = 0;
    if (text == nullptr || !ParseNumber(text, &value)) return;
    *word = ValueWord{.number = static_cast<float>(value)}.bits;
}

// `cell` holds the previous element's value; the parts that this element does not set keep it.
void ReadParameter(const TiXmlElement& element, ValueCell& cell) {
    std::int32_t integer = 0;
    cell.kind = ReadInteger(element, "type", &integer) ? static_cast<std::uint32_t>(integer) : kKindNone;
    switch (cell.kind) {
        case kKindNone:
            ReadNumber(element, "x", &cell.value.bits);
            ReadNumber(element, "y", &cell.second);
            break;
        case kKindMenu:
        case kKindColour:
            if (ReadInteger(element, "value", &integer)) cell.value.item = integer;
            break;
        case kKindSlider:
            ReadNumber(element, "value", &cell.value.bits);
            break;
        case kKindCheckBox:
            if (ReadInteger(element, "value", &integer)) cell.value.flag = integer != 0 ? 1 : 0;
            break;
        default:
            break;
    }
}

void ReadName(const TiXmlElement& preset, const char* attribute, char (&field)[kPresetNameWidth]) {
    std::memset(field, 0, sizeof field);
    const char* text = preset.Attribute(attribute);
    if (text != nullptr) std::memcpy(field, text, std::min(std::strlen(text), sizeof field - 1));
}

void ReadRecord(const TiXmlElement& preset, PresetRecord& record) {
    record.count = 0;
    ReadName(preset, "Name", record.name);
    ReadName(preset, "LibraryName", record.libraryName);
    ReadName(preset, "EffectName", record.effectName);
    ValueCell cell = {};
    // Only the first is looked up by name: every element after it is read as a parameter, whatever its name.
    for (const TiXmlElement* element = preset.FirstChildElement("parameter");
         element != nullptr && record.count < kPresetCellCapacity; element = element->NextSiblingElement()) {
        ReadParameter(*element, cell);
        record.values[record.count++] = cell;
    }
}

// CR LF and CR become LF: every XML parser reads line ends inside attributes this way. The text ends at its first zero.
std::string NormaliseLineEnds(const char* text, std::size_t length) {
    std::string lines;
    lines.reserve(length);
    const char* end = std::find(text, text + length, '\0');
    for (const char* p = text; p < end; ++p) {
        if (*p == '\r' && p + 1 < end && p[1] == '\n') continue;
        lines += *p == '\r' ? '\n' : *p;
    }
    return lines;
}

bool ReadDocument(const char* text, std::size_t length, PresetRecord& record) {
    // An editor that saves as UTF-8 may add a byte order mark, which is not part of the document.
    constexpr const char* kByteOrderMark = "\xEF\xBB\xBF";
    if (length >= 3 && std::memcmp(text, kByteOrderMark, 3) == 0) {
        text += 3;
        length -= 3;
    }
    const std::string lines = NormaliseLineEnds(text, length);
    if (!IsWithinXmlLimits(lines.c_str())) return false;
    TiXmlDocument document;
    document.Parse(lines.c_str(), nullptr, TIXML_ENCODING_LEGACY);
    const TiXmlElement* preset = document.FirstChildElement("Preset");
    if (document.Error() || preset == nullptr) return false;
    ReadRecord(*preset, record);
    return record.count > 0;
}

}  // namespace

bool ParsePreset(const char* text, std::size_t length, PresetRecord* record) noexcept {
    if (text == nullptr || record == nullptr || length > kPresetFileLimit) return false;
    try {
        return ReadDocument(text, length, *record);
    } catch (const std::exception&) {  // not enough memory
        return false;
    }
}

bool ReadPreset(const char* fileName, PresetRecord* record) noexcept {
    if (fileName == nullptr || record == nullptr) return false;
    try {
        std::string content;
        return ReadWholeFile(fileName, kPresetFileLimit, &content) &&
               ParsePreset(content.data(), content.size(), record);
    } catch (const std::exception&) {
        return false;
    }
}

}  // namespace velmora

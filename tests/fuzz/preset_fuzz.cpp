// Feeds arbitrary bytes to the preset reader: it must not crash, hang or break the rules of the record.
#include <tinyxml.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>

#include "user_presets/preset_file.h"
#include "user_presets/file_access.h"

namespace {

void Require(bool condition) {
    if (!condition) std::abort();
}

int DepthOf(const TiXmlNode& node) {
    int deepest = 0;
    for (const TiXmlNode* child = node.FirstChild(); child != nullptr; child = child->NextSibling()) {
        deepest = std::max(deepest, DepthOf(*child));
    }
    return deepest + (node.ToElement() != nullptr ? 1 : 0);
}

bool HasManyAttributes(const TiXmlNode& node) {
    int count = 0;
    if (const TiXmlElement* element = node.ToElement()) {
        for (const auto* a = element->FirstAttribute(); a != nullptr; a = a->Next()) ++count;
    }
    bool hasMany = count > velmora::kXmlAttributeLimit;
    for (const TiXmlNode* child = node.FirstChild(); child != nullptr; child = child->NextSibling()) {
        hasMany = hasMany || HasManyAttributes(*child);
    }
    return hasMany;
}

// The scanner and the parser must read the same structure. Small texts only, because the parser recurses.
void CompareWithParser(const std::string& text) {
    if (text.size() > 4096) return;
    TiXmlDocument document;
    document.Parse(text.c_str(), nullptr, TIXML_ENCODING_LEGACY);
    const bool isFine = !document.Error() && document.FirstChildElement() != nullptr;
    const bool isLarge = DepthOf(document) > velmora::kXmlDepthLimit || HasManyAttributes(document);
    // References that swallow markup are refused on purpose, so a text with one proves nothing.
    const bool hasReference = text.find("&#") != std::string::npos;
    if (velmora::IsWithinXmlLimits(text.c_str())) {
        Require(!isLarge);
    } else if (!hasReference) {
        Require(!isFine || isLarge);
    }
}

bool IsTerminated(const char (&field)[velmora::kPresetNameWidth]) {
    return std::memchr(field, 0, sizeof field) != nullptr;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string text(reinterpret_cast<const char*>(data), size);
    velmora::PresetRecord record;
    std::memset(&record, 0x5A, sizeof record);
    const velmora::PresetRecord untouched = record;
    const bool isRead = velmora::ParsePreset(text.data(), text.size(), &record);
    // Every byte is compared here, whatever it means.
    // NOLINTNEXTLINE(bugprone-suspicious-memory-comparison)
    if (isRead || std::memcmp(&record, &untouched, sizeof record) != 0) {
        Require(record.count >= (isRead ? 1 : 0) && record.count <= velmora::kPresetCellCapacity);
        Require(IsTerminated(record.name) && IsTerminated(record.libraryName) &&
                IsTerminated(record.effectName));
    }
    CompareWithParser(text);
    return 0;
}

#include "desktop/preferences.h"

#include "desktop/registry_settings.h"

namespace velmora::support {
namespace {

constexpr char kSection[] = "Common";
constexpr char kKnobsSetting[] = "Knobs Drag Vertical";

}  // namespace

void Preferences::Read() noexcept try {
    const std::optional<std::string> knobs = ReadSetting(kSection, kKnobsSetting);
    m_knobsDragVertical = knobs && knobs->starts_with('y');
} catch (...) {
    m_knobsDragVertical = false;  // short of memory
}

void Preferences::SetKnobsDragVertical(bool vertical) noexcept try {
    m_knobsDragVertical = vertical;
    WriteSetting(kSection, kKnobsSetting, vertical ? "yes" : "no");
} catch (...) {
    // Short of memory: as when the registry refuses.
}

}  // namespace velmora::support

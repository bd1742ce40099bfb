#include "effects/master_settings.h"

#include <array>
#include <iterator>
#include <new>

#include "render/rounding.h"

namespace velmora {
namespace {

static_assert(std::size(kMasterRows) <= MasterSettingsList::kCapacity);

// Terminated by a null text.
constexpr auto kPatterns = [] {
    std::array<MenuItem, kPatternItems.size() + 1> items{};
    for (std::size_t i = 0; i < kPatternItems.size(); ++i) {
        items[i] = {kPatternItems[i], kFirstPatternValue + static_cast<std::int32_t>(i)};
    }
    return items;
}();

CRsFX_Param* MakeEntry(const MasterRow& row) noexcept {
    const auto whole = [](float value) { return static_cast<std::int32_t>(value); };
    switch (row.kind) {
        case MasterKind::kBegin:
        case MasterKind::kEnd:
            return new (std::nothrow) CRsFX_Group(row.id, row.name, row.kind == MasterKind::kBegin);
        case MasterKind::kInteger:
            return new (std::nothrow) CRsFX_IntegerSlider(row.id, row.name, whole(row.minimum),
                                                          whole(row.maximum), whole(row.value));
        case MasterKind::kPercent:
            return new (std::nothrow)
                CRsFX_PercentSlider(row.id, row.name, row.minimum, row.maximum, row.value, 1);
        case MasterKind::kColour:
            return new (std::nothrow) CRsFX_ColorPicker(row.id, row.name, 0xFF000000u);
        case MasterKind::kMenu:
            return new (std::nothrow) CRsFX_Menu(row.id, row.name, kPatterns.data(), whole(row.value));
        case MasterKind::kCheckBox:
            return new (std::nothrow) CRsFX_CheckBox(row.id, row.name, row.value != 0.0f);
    }
    return nullptr;
}

template <typename Param>
const Param* FindAs(const MasterSettingsList& list, Master setting, std::uint32_t code) noexcept {
    return static_cast<const Param*>(list.Find(setting, code));
}

}  // namespace

MasterSettingsList::~MasterSettingsList() {
    for (CRsFX_Param* entry : m_entries) delete entry;
}

bool MasterSettingsList::Fill() noexcept {
    for (const MasterRow& row : kMasterRows) {
        CRsFX_Param* entry = MakeEntry(row);
        if (entry == nullptr) return false;
        Append(entry);
    }
    return true;
}

bool MasterSettingsList::DescribeExposed(std::uint32_t index, ParamDescriptor& descriptor) noexcept {
    for (CRsFX_Param* entry : m_entries) {
        if (entry == nullptr) break;
        entry->Describe(descriptor);
        if (entry->IsExposed() && index-- == 0) return true;
    }
    return false;
}

void MasterSettingsList::ExposeAll() noexcept {
    ParamDescriptor scratch;
    for (std::uint32_t index = 0; DescribeExposed(index, scratch); ++index) {
    }
}

void MasterSettingsList::ReadFromHost(IVideoHost& host) noexcept {
    std::uint32_t index = 0;
    for (CRsFX_Param* entry : m_entries) {
        if (entry == nullptr) break;
        if (entry->IsExposed()) entry->ReadFromHost(host, index++);
    }
}

CRsFX_Param* MasterSettingsList::Find(std::uint32_t id, std::uint32_t code) const noexcept {
    for (CRsFX_Param* entry : m_entries) {
        if (entry == nullptr) break;
        if (entry->Id() == id) return entry->IsKind(code) ? entry : nullptr;
    }
    return nullptr;
}

void MasterSettingsList::GetPercentRaw(Master setting, float& value) const noexcept {
    if (const auto* slider = FindAs<CRsFX_PercentSlider>(*this, setting, kClassPercentSlider)) {
        value = slider->Value();
    }
}

void MasterSettingsList::GetPercentNormalised(Master setting, float& value) const noexcept {
    if (const auto* slider = FindAs<CRsFX_PercentSlider>(*this, setting, kClassPercentSlider)) {
        value = render::Narrow(slider->Normalised());
    }
}

void MasterSettingsList::GetPercentSigned(Master setting, float& value) const noexcept {
    if (const auto* slider = FindAs<CRsFX_PercentSlider>(*this, setting, kClassPercentSlider)) {
        value = render::Narrow(2.0 * slider->Normalised() - 1.0);
    }
}

void MasterSettingsList::GetInteger(Master setting, std::int32_t& value) const noexcept {
    if (const auto* slider = FindAs<CRsFX_IntegerSlider>(*this, setting, kClassIntegerSlider)) {
        value = slider->Value();
    }
}

void MasterSettingsList::GetCheckBox(Master setting, bool& value) const noexcept {
    if (const auto* box = FindAs<CRsFX_CheckBox>(*this, setting, kClassCheckBox)) value = box->Value();
}

void MasterSettingsList::GetMenu(Master setting, std::int32_t& value) const noexcept {
    if (const auto* menu = FindAs<CRsFX_Menu>(*this, setting, kClassMenu)) value = menu->Value();
}

void MasterSettingsList::GetColour(Master setting, std::uint32_t& value) const noexcept {
    if (const auto* picker = FindAs<CRsFX_ColorPicker>(*this, setting, kClassColourPicker)) {
        value = picker->Value();
    }
}

}  // namespace velmora

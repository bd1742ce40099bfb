#include "effects/master_settings.h"

#include <memory>
#include <new>

#include "render/rounding.h"

namespace velmora {
namespace {

constexpr MenuItem kPatterns[] = {
    {"Wavy", 2000},     {"Blotchy", 2001}, {"Grainy", 2002},  {"Fine", 2003},
    {"Splotchy", 2004}, {"Lite", 2005},    {"Crackly", 2006}, {nullptr, 0},
};

enum class Entry { kBegin, kEnd, kInteger, kPercent, kColour, kMenu, kCheckBox };

struct MasterRow {
    std::uint32_t id;
    const char* name;
    Entry kind;
    float minimum;
    float maximum;
    float value;  // menu: item value; check box: 0 or 1; colours start as opaque black
};

// The order of the rows is the order in which effects are asked for the settings.
// clang-format off
constexpr MasterRow kRows[] = {
    // id   name                 kind              min    max   value
    {100, "Jitter",              Entry::kBegin,      0,     0,     0},
    {101, "Y Jitter",            Entry::kInteger,    0,    10,     2},
    {102, "X Jitter",            Entry::kInteger,    0,    10,     2},
    {103, "Border",              Entry::kColour,     0,     0,     0},
    {199, "",                    Entry::kEnd,        0,     0,     0},
    {300, "Color",               Entry::kBegin,      0,     0,     0},
    {302, "Flicker",             Entry::kPercent,    0,   100,    16},
    {303, "Flicker Speed",       Entry::kPercent,    0,   100, 24.5f},
    {304, "Brightness",          Entry::kPercent, -100,   100,     0},
    {305, "Contrast",            Entry::kPercent, -100,   100,     0},
    {399, "",                    Entry::kEnd,        0,     0,     0},
    {500, "Gamma",               Entry::kBegin,      0,     0,     0},
    {301, "Saturation",          Entry::kPercent, -100,   100,     0},
    {502, "Tint",                Entry::kColour,     0,     0,     0},
    {503, "Tint",                Entry::kPercent, -100,   100,     0},
    {501, "Film Gamma",          Entry::kPercent,    0,   100,     0},
    {599, "",                    Entry::kEnd,        0,     0,     0},
    {200, "Blur",                Entry::kBegin,      0,     0,     0},
    {201, "Glow",                Entry::kPercent,    0,   100,     9},
    {299, "",                    Entry::kEnd,        0,     0,     0},
    {600, "Wear",                Entry::kBegin,      0,     0,     0},
    {601, "Wear",                Entry::kPercent,    0,   100,    12},
    {602, "Pattern",             Entry::kMenu,       0,     0,  2001},
    {603, "Blue Channel Only",   Entry::kCheckBox,   0,     0,     0},
    {699, "",                    Entry::kEnd,        0,     0,     0},
    {700, "Damage",              Entry::kBegin,      0,     0,     0},
    {707, "Spots",               Entry::kPercent,    0,   100,    20},
    {701, "Scratches",           Entry::kPercent,    0,   100, 36.5f},
    {702, "Depth",               Entry::kPercent,    0,   100,    37},
    {704, "Black",               Entry::kCheckBox,   0,     0,     1},
    {705, "White",               Entry::kCheckBox,   0,     0,     1},
    {706, "Thick",               Entry::kCheckBox,   0,     0,     1},
    {799, "",                    Entry::kEnd,        0,     0,     0},
};
// clang-format on
static_assert(std::size(kRows) == 33 && std::size(kRows) <= MasterSettingsList::kCapacity);

CRsFX_Param* MakeEntry(const MasterRow& row) noexcept {
    const auto whole = [](float value) { return static_cast<std::int32_t>(value); };
    switch (row.kind) {
        case Entry::kBegin:
        case Entry::kEnd:
            return new (std::nothrow) CRsFX_Group(row.id, row.name, row.kind == Entry::kBegin);
        case Entry::kInteger:
            return new (std::nothrow) CRsFX_IntegerSlider(row.id, row.name, whole(row.minimum),
                                                          whole(row.maximum), whole(row.value));
        case Entry::kPercent:
            return new (std::nothrow)
                CRsFX_PercentSlider(row.id, row.name, row.minimum, row.maximum, row.value, 1);
        case Entry::kColour:
            return new (std::nothrow) CRsFX_ColorPicker(row.id, row.name, 0xFF000000u);
        case Entry::kMenu:
            return new (std::nothrow) CRsFX_Menu(row.id, row.name, kPatterns, whole(row.value));
        case Entry::kCheckBox:
            return new (std::nothrow) CRsFX_CheckBox(row.id, row.name, row.value != 0.0f);
    }
    return nullptr;
}

template <typename Param>
const Param* FindAs(const MasterSettingsList& list, std::uint32_t id, std::uint32_t code) noexcept {
    return static_cast<const Param*>(list.Find(id, code));
}

}  // namespace

MasterSettingsList::~MasterSettingsList() {
    for (CRsFX_Param* entry : m_entries) delete entry;
}

bool MasterSettingsList::Fill() noexcept {
    for (const MasterRow& row : kRows) {
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

void MasterSettingsList::GetPercentRaw(std::uint32_t id, float& value) const noexcept {
    if (const auto* slider = FindAs<CRsFX_PercentSlider>(*this, id, kClassPercentSlider)) {
        value = slider->Value();
    }
}

void MasterSettingsList::GetPercentNormalised(std::uint32_t id, float& value) const noexcept {
    if (const auto* slider = FindAs<CRsFX_PercentSlider>(*this, id, kClassPercentSlider)) {
        value = render::Narrow(slider->Normalised());
    }
}

void MasterSettingsList::GetPercentSigned(std::uint32_t id, float& value) const noexcept {
    if (const auto* slider = FindAs<CRsFX_PercentSlider>(*this, id, kClassPercentSlider)) {
        value = render::Narrow(2.0 * slider->Normalised() - 1.0);
    }
}

void MasterSettingsList::GetInteger(std::uint32_t id, std::int32_t& value) const noexcept {
    if (const auto* slider = FindAs<CRsFX_IntegerSlider>(*this, id, kClassIntegerSlider)) {
        value = slider->Value();
    }
}

void MasterSettingsList::GetCheckBox(std::uint32_t id, bool& value) const noexcept {
    if (const auto* box = FindAs<CRsFX_CheckBox>(*this, id, kClassCheckBox)) value = box->Value();
}

void MasterSettingsList::GetMenu(std::uint32_t id, std::int32_t& value) const noexcept {
    if (const auto* menu = FindAs<CRsFX_Menu>(*this, id, kClassMenu)) value = menu->Value();
}

void MasterSettingsList::GetColour(std::uint32_t id, std::uint32_t& value) const noexcept {
    if (const auto* picker = FindAs<CRsFX_ColorPicker>(*this, id, kClassColourPicker)) {
        value = picker->Value();
    }
}

}  // namespace velmora

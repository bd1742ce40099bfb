#include "effects/params.h"

#include <cstring>

#include "platform/float_guard.h"
#include "render/rounding.h"

namespace velmora {
namespace {

ValueCell ReadCell(IVideoHost& host, std::uint32_t index, ParamKind kind) noexcept {
    const FloatGuard guard;  // the host may change the processor's state while it answers
    ValueCell cell = {};
    host.GetParamValue(index, &cell, kind);
    return cell;
}

}  // namespace

void CopyBounded(char* field, std::int32_t width, const char* text) noexcept {
    for (std::int32_t i = 0; i < width; ++i) {
        field[i] = text[i];
        if (text[i] == '\0') return;
    }
}

float SanitizeNormalised(float value) noexcept {
    if (!(value > 0.0f)) return 0.0f;
    return value < 1.0f ? value : 1.0f;
}

void CRsFX_Param::Describe(ParamDescriptor& descriptor) noexcept {
    std::memset(&descriptor, 0, sizeof descriptor);
    CopyBounded(descriptor.name, kParamNameWidth, m_name);
}

void CRsFX_Param::ReadFromHost(IVideoHost&, std::uint32_t) noexcept {}

void CRsFX_Param::DescribeAs(ParamDescriptor& descriptor, ParamKind kind) noexcept {
    CRsFX_Param::Describe(descriptor);
    descriptor.kind = kind;
    m_exposed = true;
}

// A slider's default is its value divided by the maximum, not by the range: these descriptors only mark settings as
// exposed; the host sees the descriptors of the effects.
void CRsFX_PercentSlider::Describe(ParamDescriptor& descriptor) noexcept {
    DescribeAs(descriptor, kKindSlider);
    descriptor.defaultValue.number = m_value / m_maximum;
    descriptor.minimum.number = m_minimum;
    descriptor.slider.maximum.number = m_maximum;
}

void CRsFX_PercentSlider::ReadFromHost(IVideoHost& host, std::uint32_t index) noexcept {
    m_value = m_maximum * SanitizeNormalised(ReadCell(host, index, kKindSlider).value.number);
}

double CRsFX_PercentSlider::Normalised() const noexcept {
    const double minimum = m_minimum;
    return (m_value - minimum) / (m_maximum - minimum);
}

void CRsFX_IntegerSlider::Describe(ParamDescriptor& descriptor) noexcept {
    DescribeAs(descriptor, kKindSlider);
    descriptor.defaultValue.number = static_cast<float>(m_value) / static_cast<float>(m_maximum);
    descriptor.minimum.number = static_cast<float>(m_minimum);
    descriptor.slider.maximum.number = static_cast<float>(m_maximum);
}

void CRsFX_IntegerSlider::ReadFromHost(IVideoHost& host, std::uint32_t index) noexcept {
    const float normalised = SanitizeNormalised(ReadCell(host, index, kKindSlider).value.number);
    m_value = render::RoundHalfAway(static_cast<float>(m_maximum) * normalised);
}

void CRsFX_CheckBox::Describe(ParamDescriptor& descriptor) noexcept {
    DescribeAs(descriptor, kKindCheckBox);
    descriptor.defaultValue.flag = m_value ? 1 : 0;
}

void CRsFX_CheckBox::ReadFromHost(IVideoHost& host, std::uint32_t index) noexcept {
    m_value = ReadCell(host, index, kKindCheckBox).value.flag != 0;
}

void CRsFX_Menu::Describe(ParamDescriptor& descriptor) noexcept {
    DescribeAs(descriptor, kKindMenu);
    m_itemCount = 0;
    std::int32_t defaultItem = 0;
    for (const MenuItem* item = m_items; item != nullptr && item->text != nullptr; ++item) {
        if (m_itemCount == kMenuItemCapacity) break;
        if (item->value == m_defaultValue) defaultItem = m_itemCount;
        CopyBounded(descriptor.itemTexts[m_itemCount], kMenuTextWidth, item->text);
        ++m_itemCount;
    }
    descriptor.minimum.item = m_itemCount;
    descriptor.defaultValue.item = defaultItem;
}

void CRsFX_Menu::ReadFromHost(IVideoHost& host, std::uint32_t index) noexcept {
    const std::int32_t item = ReadCell(host, index, kKindMenu).value.item;
    if (m_items != nullptr && item >= 0 && item < m_itemCount) m_value = m_items[item].value;
}

void CRsFX_ColorPicker::Describe(ParamDescriptor& descriptor) noexcept {
    DescribeAs(descriptor, kKindColour);
    descriptor.defaultValue.colour = m_colour;
}

void CRsFX_ColorPicker::ReadFromHost(IVideoHost& host, std::uint32_t index) noexcept {
    const std::uint32_t word = ReadCell(host, index, kKindColour).value.colour;  // 0x00BBGGRR
    m_colour = 0xFF000000u | (word & 0xFFu) << 16 | (word & 0xFF00u) | ((word >> 16) & 0xFFu);
}

}  // namespace velmora

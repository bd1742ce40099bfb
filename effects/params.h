// The master settings as objects, each of which describes itself to a host and reads its value from one. They belong to a
// MasterSettingsList (effects/master_settings.h); every frame overwrites their values.
#pragma once

#include <cstdint>

#include "api/host_api.h"

namespace velmora {

enum ParamClassCode : std::uint32_t {
    kClassParam = 9000,
    kClassPercentSlider = 9001,
    kClassIntegerSlider = 9002,
    kClassCheckBox = 9003,
    kClassMenu = 9004,
    kClassColourPicker = 9005,
    kClassGroup = 9006,
};

// Copies a text into a field, up to and including its zero or up to the field's end, whichever comes first: a text that
// fills the field is not terminated. The bytes after the zero stay as they are.
void CopyBounded(char* field, std::int32_t width, const char* text) noexcept;

// A slider value from a host: NaN reads as 0, other values are clamped to 0..1.
float SanitizeNormalised(float value) noexcept;

class CRsFX_Param {
  public:
    CRsFX_Param(std::uint32_t id, const char* name) noexcept : m_id(id), m_name(name) {}
    virtual ~CRsFX_Param() = default;
    CRsFX_Param(const CRsFX_Param&) = delete;
    CRsFX_Param& operator=(const CRsFX_Param&) = delete;

    // Sets the whole descriptor. All but groups are exposed from their first description on.
    virtual void Describe(ParamDescriptor& descriptor) noexcept;
    // Takes the value from the host's master setting `index`. The host's return value is ignored: a value that it does
    // not write reads as 0.
    virtual void ReadFromHost(IVideoHost& host, std::uint32_t index) noexcept;
    [[nodiscard]] virtual bool IsKind(std::uint32_t code) const noexcept { return code == kClassParam; }

    [[nodiscard]] std::uint32_t Id() const noexcept { return m_id; }
    [[nodiscard]] bool IsExposed() const noexcept { return m_exposed; }

  protected:
    void DescribeAs(ParamDescriptor& descriptor, ParamKind kind) noexcept;

  private:
    std::uint32_t m_id;
    bool m_exposed = false;
    const char* m_name;  // not copied
};

class CRsFX_PercentSlider final : public CRsFX_Param {
  public:
    CRsFX_PercentSlider(std::uint32_t id, const char* name, float minimum, float maximum, float value,
                        std::int32_t flag) noexcept
        : CRsFX_Param(id, name), m_minimum(minimum), m_maximum(maximum), m_value(value), m_flag(flag) {}

    void Describe(ParamDescriptor& descriptor) noexcept override;
    void ReadFromHost(IVideoHost& host, std::uint32_t index) noexcept override;
    [[nodiscard]] bool IsKind(std::uint32_t code) const noexcept override {
        return code == kClassPercentSlider;
    }

    [[nodiscard]] float Value() const noexcept { return m_value; }
    // (value - minimum) / (maximum - minimum), in double precision.
    [[nodiscard]] double Normalised() const noexcept;

  private:
    float m_minimum;
    float m_maximum;
    float m_value;
    [[maybe_unused]] std::int32_t m_flag;  // part of the object's layout
};

class CRsFX_IntegerSlider final : public CRsFX_Param {
  public:
    CRsFX_IntegerSlider(std::uint32_t id, const char* name, std::int32_t minimum, std::int32_t maximum,
                        std::int32_t value) noexcept
        : CRsFX_Param(id, name), m_minimum(minimum), m_maximum(maximum), m_value(value) {}

    void Describe(ParamDescriptor& descriptor) noexcept override;
    void ReadFromHost(IVideoHost& host, std::uint32_t index) noexcept override;
    [[nodiscard]] bool IsKind(std::uint32_t code) const noexcept override {
        return code == kClassIntegerSlider;
    }

    [[nodiscard]] std::int32_t Value() const noexcept { return m_value; }

  private:
    std::int32_t m_minimum;
    std::int32_t m_maximum;
    std::int32_t m_value;
};

class CRsFX_CheckBox final : public CRsFX_Param {
  public:
    CRsFX_CheckBox(std::uint32_t id, const char* name, bool value) noexcept
        : CRsFX_Param(id, name), m_value(value) {}

    void Describe(ParamDescriptor& descriptor) noexcept override;
    void ReadFromHost(IVideoHost& host, std::uint32_t index) noexcept override;
    [[nodiscard]] bool IsKind(std::uint32_t code) const noexcept override { return code == kClassCheckBox; }

    [[nodiscard]] bool Value() const noexcept { return m_value; }

  private:
    bool m_value;
};

// A menu item; a table of them ends with a null text.
struct MenuItem {
    const char* text;
    std::int32_t value;
};

class CRsFX_Menu final : public CRsFX_Param {
  public:
    CRsFX_Menu(std::uint32_t id, const char* name, const MenuItem* items, std::int32_t defaultValue) noexcept
        : CRsFX_Param(id, name), m_items(items), m_defaultValue(defaultValue) {}

    void Describe(ParamDescriptor& descriptor) noexcept override;
    // An index outside the items counted by the last description leaves the value unchanged.
    void ReadFromHost(IVideoHost& host, std::uint32_t index) noexcept override;
    [[nodiscard]] bool IsKind(std::uint32_t code) const noexcept override { return code == kClassMenu; }

    [[nodiscard]] std::int32_t Value() const noexcept { return m_value; }

  private:
    const MenuItem* m_items;
    std::int32_t m_defaultValue;
    std::int32_t m_value = 0;
    std::int32_t m_itemCount = 0;
};

class CRsFX_ColorPicker final : public CRsFX_Param {
  public:
    CRsFX_ColorPicker(std::uint32_t id, const char* name, std::uint32_t colour) noexcept
        : CRsFX_Param(id, name), m_colour(colour) {}

    // Describes the stored word as it is: these descriptors only mark settings as exposed.
    void Describe(ParamDescriptor& descriptor) noexcept override;
    void ReadFromHost(IVideoHost& host, std::uint32_t index) noexcept override;
    [[nodiscard]] bool IsKind(std::uint32_t code) const noexcept override {
        return code == kClassColourPicker;
    }

    // 0xFFRRGGBB.
    [[nodiscard]] std::uint32_t Value() const noexcept { return m_colour; }

  private:
    std::uint32_t m_colour;
};

class CRsFX_Group final : public CRsFX_Param {
  public:
    CRsFX_Group(std::uint32_t id, const char* name, bool isBegin) noexcept
        : CRsFX_Param(id, name), m_isBegin(isBegin) {}

    [[nodiscard]] bool IsKind(std::uint32_t code) const noexcept override { return code == kClassGroup; }

  private:
    // Part of the entry; the library does not use it, as hosts draw their groups from the effects' tables.
    [[maybe_unused]] bool m_isBegin;
};

}  // namespace velmora

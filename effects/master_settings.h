// The master settings list: the rows of effects/master_table.h as objects that hold the current values.
#pragma once

#include <array>
#include <cstdint>

#include "effects/master_table.h"
#include "effects/params.h"
#include "render/stage_settings.h"

namespace velmora {

class MasterSettingsList {
  public:
    static constexpr std::uint32_t kCapacity = 40;

    MasterSettingsList() noexcept = default;
    MasterSettingsList(const MasterSettingsList&) = delete;
    MasterSettingsList& operator=(const MasterSettingsList&) = delete;
    // Frees the entries. (The library keeps its lists until the process ends.)
    ~MasterSettingsList();

    // Adds the 33 entries; false when there is not enough memory (the list is then incomplete and must not be used).
    [[nodiscard]] bool Fill() noexcept;
    // Describes the k-th exposed entry; false past the last one. Describing an entry exposes it, so a host that describes
    // all of them exposes all settings.
    bool DescribeExposed(std::uint32_t index, ParamDescriptor& descriptor) noexcept;
    // Exposes every setting, as describing them all does.
    void ExposeAll() noexcept;
    // Lets every exposed entry read its value from `host`, with a running index from 0.
    void ReadFromHost(IVideoHost& host) noexcept;

    // Takes ownership. The caller must not exceed the capacity.
    void Append(CRsFX_Param* entry) noexcept { m_entries[m_count++] = entry; }
    // The first entry with this id if it is of this kind; otherwise null.
    [[nodiscard]] CRsFX_Param* Find(std::uint32_t id, std::uint32_t code) const noexcept;
    [[nodiscard]] CRsFX_Param* Find(Master setting, std::uint32_t code) const noexcept {
        return Find(static_cast<std::uint32_t>(setting), code);
    }

    // Typed getters. If there is no such entry, they leave the destination unchanged. They compute in double precision and
    // round to float when they write.
    void GetPercentRaw(Master setting, float& value) const noexcept;
    void GetPercentNormalised(Master setting, float& value) const noexcept;  // 0..1 over the range
    void GetPercentSigned(Master setting, float& value) const noexcept;      // 2 * normalised - 1
    void GetInteger(Master setting, std::int32_t& value) const noexcept;
    void GetCheckBox(Master setting, bool& value) const noexcept;
    void GetMenu(Master setting, std::int32_t& value) const noexcept;
    void GetColour(Master setting, std::uint32_t& value) const noexcept;  // 0xFFRRGGBB

  private:
    std::array<CRsFX_Param*, kCapacity> m_entries{};  // terminated by a null
    std::uint32_t m_count = 0;
};

// The stages' settings, from the list's current values.
[[nodiscard]] render::StageSettings ReadStageSettings(const MasterSettingsList& list) noexcept;

}  // namespace velmora

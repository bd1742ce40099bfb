// The host side of a running effect: answers the effect's requests with values that a check chooses.
#pragma once

#include <array>
#include <cstdint>
#include <string>
#include <vector>

#include "api/host_api.h"
#include "programs/reelcheck/check.h"
#include "programs/reelcheck/frame.h"

namespace velmora::reelcheck {

class PlayingHost final : public PlainHost {
  public:
    static constexpr std::uint32_t kCapacity = 64;

    std::array<ValueWord, kCapacity> values = {};
    bool answers = true;          // false: every request fails and no cell is written
    bool spoilsRounding = false;  // every answer changes the floating-point control words
    std::uint32_t questions = 0;

    bool VM_CALL GetParamValue(std::uint32_t index, ValueCell* cell, std::uint32_t kind) override;
};

// What an effect reports about itself.
struct EffectFacts {
    std::string name;
    std::vector<ParamDescriptor> params;
    std::vector<std::string> presets;

    [[nodiscard]] static EffectFacts Of(IVideoEffect& effect);
    // The first preset with that name; throws CheckFailed when there is none.
    [[nodiscard]] std::uint32_t Preset(const char* wanted) const;
};

[[nodiscard]] std::string ParamName(const ParamDescriptor& descriptor);

// Sets of values: one of the effect's own presets; values that a control can show, most of them on; arbitrary values.
void ChoosePreset(PlayingHost& host, IVideoEffect& effect, std::uint32_t preset);
void ChooseFair(PlayingHost& host, const EffectFacts& facts, Dice& dice);
void ChooseHostile(PlayingHost& host, const EffectFacts& facts, Dice& dice);
// Everything on, as far as possible.
void ChooseFull(PlayingHost& host, const EffectFacts& facts);

[[nodiscard]] bool Process(IVideoEffect& effect, IVideoHost* host, const FrameRecord& source,
                           const FrameRecord& destination, double seconds);

// Renders into a destination filled with a value. Fails when the effect refuses, or writes outside the smaller of the
// two regions.
void RenderInside(IVideoEffect& effect, IVideoHost& host, const Frame& source, Frame& destination,
                  double seconds);

}  // namespace velmora::reelcheck

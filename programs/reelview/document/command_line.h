// Two command lines: the one that started the program, and the one for reelfx that renders what the window shows.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "programs/common/effect_info.h"
#include "text/number_text.h"
#include "programs/reelview/document/settings_history.h"

namespace velmora::reelview {

// reelview [--library PATH] [--effect NAME] [--sequence] [FILE]
struct ViewOptions {
    std::u16string library;  // empty: next to the program
    std::u16string effect;
    std::u16string file;
    bool isSequence = false;  // the file is one of a numbered sequence
    bool isValid = true;
};

// `arguments` without the program's name.
[[nodiscard]] ViewOptions ReadViewOptions(const std::vector<std::u16string>& arguments);

// What reelfx is to render.
struct CommandInput {
    std::string path;  // in UTF-8; for numbered pictures, their pattern (source/clip_source.h)
    // For numbered pictures only:
    std::optional<hosts::FrameRate> rate;
    std::uint64_t firstNumber = 0;
    std::int64_t count = 0;  // 0: up to the last one that there is
};

// Values equal to the parameter's default are left out. Where two parameters share a name, the kind of the value shows
// which one is meant, so each can be written.
[[nodiscard]] std::string CommandText(const CommandInput& input, const hosts::EffectInfo& effect,
                                      const Values& values);

}  // namespace velmora::reelview

// One plug-in instance: the values that the host has set, and a session of the effect. A host may call an
// instance from several threads at once; the calls are serialised.
//
// A preset supplies all values that the host has not set. Some hosts set every parameter, mostly to its
// default; so a value that is at its default does not override the preset.
//
// A text that is not what its parameter takes, such as an unknown preset, is a fault: it is written to standard error
// and, until the host sets another text, on every frame, since frei0r has no other way to refuse it.
#pragma once

#include <frei0r.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "effects/effect_session.h"
#include "faces/frei0r/frame_clock.h"
#include "faces/frei0r/plugin_params.h"

namespace velmora::hosts::frei0r {

class Instance {
  public:
    // `plugin` outlives the instance. Throws std::bad_alloc.
    Instance(const PluginDescription& plugin, std::uint32_t width, std::uint32_t height, TimeUnit hostUnit);

    // As f0r_set_param_value and f0r_get_param_value. An index past the last parameter does nothing.
    void Set(int index, const void* value);
    void Get(int index, void* value);

    // Width * height pixels of red, green, blue and alpha bytes, rows without padding; may be the same memory.
    void Update(double hostTime, const std::uint32_t* in, std::uint32_t* out) noexcept;

  private:
    struct OwnValue {
        ValueWord value{};
        bool isSet = false;
    };

    void SetText(std::size_t index, std::string text);
    // False if the parameter does not take the text.
    bool ReadText(const PluginParam& param, const std::string& text);
    bool ReadPresetText(const std::string& text);
    void SetOwn(const PluginParam& param, const void* value);
    [[nodiscard]] bool IsDefault(std::uint32_t own) const noexcept;
    void TellSession() noexcept;
    [[nodiscard]] std::vector<std::string> FaultLines() const;
    [[nodiscard]] bool Render(double hostTime, const std::uint32_t* in, std::uint32_t* out) noexcept;

    const PluginDescription& m_plugin;
    const std::size_t m_pixelCount;
    const std::uint32_t m_width, m_height;
    std::mutex m_mutex;  // guards all below
    std::unique_ptr<effects::EffectSession> m_session;
    std::vector<std::string> m_texts;   // by parameter of the plug-in; only strings are used
    std::vector<std::string> m_faults;  // by parameter of the plug-in; empty: none
    std::vector<OwnValue> m_own;        // by parameter of the effect
    FrameClock m_clock;
    std::vector<ValueWord> m_presetValues;  // by parameter of the effect; empty without a preset
    std::uint32_t m_seed = 0;
    std::unique_ptr<std::uint32_t[]>
        m_source;  // the input in the effect's pixel order; allocated by the first frame
};

// What a plug-in shows instead of a picture that it cannot make (error_picture.cpp). Frei0r has no way to refuse a value or
// a frame, and a film that passes unprocessed may be noticed only after hours of rendering. So the fault is written on
// every frame.
//
// Fills the picture with stripes and writes the lines on it, as large as fits. Letters are shown as capitals; besides
// digits, other characters are left blank.
void PaintError(const std::vector<std::string>& lines, std::uint32_t* pixels, std::uint32_t width,
                std::uint32_t height) noexcept;

}  // namespace velmora::hosts::frei0r

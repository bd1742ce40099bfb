#include "faces/frei0r/instance.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <limits>
#include <new>

#include "effects/effect_queries.h"
#include "user_presets/file_access.h"
#include "user_presets/preset_file.h"
#include "text/names.h"
#include "text/number_text.h"

namespace velmora::hosts::frei0r {
namespace {

std::uint32_t ColourByte(float channel) {
    if (!(channel > 0.0f)) return 0;  // also for NaN
    return static_cast<std::uint32_t>(std::lround(std::min(channel, 1.0f) * 255.0f));
}

ValueWord WordOf(f0r_param_color_t colour) {
    ValueWord word{};
    word.colour = ColourByte(colour.r) | ColourByte(colour.g) << 8 | ColourByte(colour.b) << 16;
    return word;
}

f0r_param_color_t ColourOf(ValueWord word) {
    const auto channel = [&](int shift) {
        return static_cast<float>((word.colour >> shift) & 0xFFu) / 255.0f;
    };
    return {channel(0), channel(8), channel(16)};
}

std::string DefaultText(const PluginDescription& plugin, const PluginParam& param) {
    switch (param.role) {
        case ParamRole::kSeed:
        case ParamRole::kStartFrame:
            return "0";
        case ParamRole::kOwn:
            if (param.type != F0R_PARAM_STRING) return "";
            return plugin.effect.params[param.own].items[plugin.effect.params[param.own].defaultValue.count];
        default:
            return "";
    }
}

// Editors may write a whole number with decimals.
std::optional<std::int64_t> WholeNumber(std::string_view text) {
    if (const auto number = ParseInteger(text)) return number;
    const auto number = ParseNumber(text);
    if (!number || std::abs(*number) > 1e15) return std::nullopt;
    return std::llround(*number);
}

std::optional<std::uint32_t> SeedOf(std::string_view text) {
    if (text.empty()) return 0;
    const auto seed = WholeNumber(text);
    if (!seed || *seed < 0 || *seed > std::numeric_limits<std::uint32_t>::max()) return std::nullopt;
    return static_cast<std::uint32_t>(*seed);
}

// A preset file is named by its path, so that no name of a preset is taken for one.
bool IsPath(const std::string& text) {
    return text.find_first_of("/\\") != std::string::npos;
}

// The values in a preset file, by parameter of the effect; empty when it cannot be read or belongs to another effect.
std::vector<ValueWord> PresetFileValues(const effects::EffectTable& effect, const std::string& path) {
    PresetRecord record{};
    std::vector<std::uint32_t> kinds;
    for (const effects::ParamRow& row : effect.params) kinds.push_back(row.kind);
    const auto name = FileNameFromUtf8(path);
    if (!name || !ReadPreset(name->c_str(), &record) ||
        !IsCompatible(kLibraryName, effect.name, kinds, &record)) {
        return {};
    }
    std::vector<ValueWord> values;
    for (std::size_t i = 0; i < kinds.size(); ++i) values.push_back(record.values[i].value);
    return values;
}

bool IsNone(const std::string& text) {
    return text.empty() || IsSameName(text, "none");
}

// The preset or item that was probably meant.
std::optional<std::string> NearestTo(const PluginDescription& plugin, const PluginParam& param,
                                     const std::string& text) {
    std::vector<std::string> names;
    if (param.role == ParamRole::kPreset) {
        names.assign(plugin.effect.presetNames.begin(), plugin.effect.presetNames.end());
    } else if (param.role == ParamRole::kOwn) {
        const auto& items = plugin.effect.params[param.own].items;
        names.assign(items.begin(), items.end());
    }
    return NearestName(text, names);
}

// Frei0r's cheapest colour model in hosts is red, green, blue, alpha; the effects work on blue, green, red, alpha.
// Exchanges bytes 0 and 2 of each pixel. `in` and `out` may be the same. Written for the compiler's vectors.
void SwapRedAndBlue(const std::uint32_t* in, std::uint32_t* out, std::size_t count) noexcept {
    for (std::size_t i = 0; i < count; ++i) {
        const std::uint32_t pixel = in[i];
        out[i] = (pixel & 0xFF00FF00u) | ((pixel & 0xFFu) << 16) | ((pixel >> 16) & 0xFFu);
    }
}

void Warn(const PluginDescription& plugin, const PluginParam& param, const std::string& text) {
    const auto nearest = NearestTo(plugin, param, text);
    const std::string hint = nearest ? "; did you mean \"" + *nearest + "\"?" : ".";
    std::fprintf(stderr, "%s: %s cannot be \"%s\"%s %s\n", plugin.fileName.c_str(), param.name.c_str(),
                 text.c_str(), hint.c_str(), param.explanation.c_str());
}

}  // namespace

Instance::Instance(const PluginDescription& plugin, std::uint32_t width, std::uint32_t height,
                   TimeUnit hostUnit)
    : m_plugin(plugin),
      m_pixelCount(std::size_t{width} * height),
      m_width(width),
      m_height(height),
      m_session(effects::EffectSession::Create(plugin.effect)),
      m_own(plugin.effect.params.size()),
      m_clock(hostUnit) {
    if (m_session == nullptr) throw std::bad_alloc();
    for (const PluginParam& param : plugin.params) m_texts.push_back(DefaultText(plugin, param));
    m_faults.resize(m_texts.size());
    for (std::size_t i = 0; i < m_own.size(); ++i) m_own[i].value = plugin.effect.params[i].defaultValue;
}

void Instance::Set(int index, const void* value) {
    const auto i = static_cast<std::size_t>(index);
    if (i >= m_plugin.params.size() || value == nullptr) return;
    const std::scoped_lock lock(m_mutex);
    if (m_plugin.params[i].type != F0R_PARAM_STRING) {
        SetOwn(m_plugin.params[i], value);
        return;
    }
    const char* text = *static_cast<const char* const*>(value);
    SetText(i, text == nullptr ? "" : text);
}

void Instance::SetText(std::size_t index, std::string text) {
    const PluginParam& param = m_plugin.params[index];
    const bool isNew = text != m_texts[index];
    if (!isNew && param.role == ParamRole::kPreset)
        return;  // hosts set it for each frame; it may name a file
    const bool isRead = ReadText(param, text);
    if (!isRead && isNew) Warn(m_plugin, param, text);
    m_faults[index] = isRead ? "" : text;
    m_texts[index] = std::move(text);
}

bool Instance::ReadText(const PluginParam& param, const std::string& text) {
    switch (param.role) {
        case ParamRole::kPreset:
            return ReadPresetText(text);
        case ParamRole::kSeed: {
            const auto seed = SeedOf(text);
            m_seed = seed.value_or(0);
            return seed.has_value();
        }
        case ParamRole::kStartFrame: {
            const auto frame = WholeNumber(text);
            m_clock.SetStartFrame(frame.value_or(0));
            return frame || text.empty();
        }
        case ParamRole::kFrameRate:
            return m_clock.SetFrameRate(text);
        case ParamRole::kOwn:
            break;
    }
    const auto item = FindItemOrNumber(m_plugin.effect.params[param.own], text);
    m_own[param.own].isSet = item.has_value();
    if (item) m_own[param.own].value.count = *item;
    return item || text.empty();
}

bool Instance::ReadPresetText(const std::string& text) {
    if (IsPath(text)) {
        m_presetValues = PresetFileValues(m_plugin.effect, text);
        return !m_presetValues.empty();
    }
    m_presetValues.clear();
    const auto preset = FindPreset(m_plugin.effect, text);
    PresetCell cell;
    for (std::uint32_t own = 0; preset && own < m_own.size(); ++own) {
        if (effects::CopyPresetValue(m_plugin.effect, *preset, own, &cell))
            m_presetValues.push_back(cell.value);
    }
    return preset || IsNone(text);
}

void Instance::SetOwn(const PluginParam& param, const void* value) {
    OwnValue& own = m_own[param.own];
    if (param.type == F0R_PARAM_COLOR) {
        own.value = WordOf(*static_cast<const f0r_param_color_t*>(value));
    } else if (param.type == F0R_PARAM_BOOL) {
        own.value.bits = *static_cast<const f0r_param_bool*>(value) >= 0.5 ? 1 : 0;
    } else {
        own.value.number = static_cast<float>(*static_cast<const f0r_param_double*>(value));
    }
    own.isSet = true;
}

void Instance::Get(int index, void* value) {
    const auto i = static_cast<std::size_t>(index);
    if (i >= m_plugin.params.size() || value == nullptr) return;
    const std::scoped_lock lock(m_mutex);
    const PluginParam& param = m_plugin.params[i];
    const ValueWord own = m_own[param.own].value;
    switch (param.type) {
        case F0R_PARAM_STRING:
            *static_cast<f0r_param_string*>(value) = m_texts[i].data();
            break;
        case F0R_PARAM_COLOR:
            *static_cast<f0r_param_color_t*>(value) = ColourOf(own);
            break;
        case F0R_PARAM_BOOL:
            *static_cast<f0r_param_bool*>(value) = own.flag != 0 ? 1.0 : 0.0;
            break;
        default:
            *static_cast<f0r_param_double*>(value) = double{own.number};
    }
}

bool Instance::IsDefault(std::uint32_t own) const noexcept {
    const effects::ParamRow& param = m_plugin.effect.params[own];
    const ValueWord value = m_own[own].value;
    switch (param.kind) {
        case kKindSlider:
            return value.number == param.defaultValue.number;
        case kKindColour:
            return ((value.colour ^ param.defaultValue.colour) & 0xFFFFFFu) == 0;
        case kKindCheckBox:
            return value.flag == param.defaultValue.flag;
        default:
            return value.bits == param.defaultValue.bits;
    }
}

void Instance::TellSession() noexcept {
    bool hostSetsAll = true;
    for (const PluginParam& param : m_plugin.params) {
        if (param.role == ParamRole::kOwn && !m_own[param.own].isSet) hostSetsAll = false;
    }
    for (std::uint32_t own = 0; own < m_own.size(); ++own) {
        const bool yieldsToPreset = !m_own[own].isSet || (hostSetsAll && IsDefault(own));
        const bool isPresets = own < m_presetValues.size() && yieldsToPreset;
        m_session->SetValue(own, isPresets ? m_presetValues[own] : m_own[own].value);
    }
    m_session->PinRandom(m_seed);
}

void Instance::Update(double hostTime, const std::uint32_t* in, std::uint32_t* out) noexcept {
    const std::scoped_lock lock(m_mutex);
    std::vector<std::string> faults;
    try {
        faults = FaultLines();
        if (faults.empty() && Render(hostTime, in, out)) return;
    } catch (const std::bad_alloc&) {
        // The stripes alone must do.
    }
    PaintError(faults, out, m_width, m_height);
}

std::vector<std::string> Instance::FaultLines() const {
    for (std::size_t i = 0; i < m_faults.size(); ++i) {
        if (m_faults[i].empty()) continue;
        const PluginParam& param = m_plugin.params[i];
        std::vector<std::string> lines = {m_plugin.name, "unknown " + param.name, m_faults[i]};
        if (const auto nearest = NearestTo(m_plugin, param, m_faults[i]))
            lines.push_back("did you mean " + *nearest);
        return lines;
    }
    return {};
}

bool Instance::Render(double hostTime, const std::uint32_t* in, std::uint32_t* out) noexcept {
    constexpr std::uint32_t kLargestSide = std::numeric_limits<std::int32_t>::max() / 4;
    if (m_width > kLargestSide || m_height > kLargestSide) return false;
    if (m_source == nullptr) m_source.reset(new (std::nothrow) std::uint32_t[m_pixelCount]);
    if (m_source == nullptr) return false;
    TellSession();
    SwapRedAndBlue(in, m_source.get(), m_pixelCount);
    const auto width = static_cast<std::int32_t>(m_width), height = static_cast<std::int32_t>(m_height);
    const FrameRecord source = {m_source.get(), width, height, width * 4, 0, 0, 0};
    const FrameRecord destination = {out, width, height, width * 4, 0, 0, 0};
    if (!m_session->Render(source, destination, m_clock.ClipSeconds(hostTime))) return false;
    SwapRedAndBlue(out, out, m_pixelCount);
    return true;
}

}  // namespace velmora::hosts::frei0r

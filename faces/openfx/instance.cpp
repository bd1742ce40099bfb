#include "faces/openfx/instance.h"

#include <algorithm>
#include <cmath>
#include <new>
#include <string>
#include <string_view>

#include "effects/effect_queries.h"
#include "faces/openfx/actions.h"
#include "platform/platform.h"
#include "text/number_text.h"

namespace velmora::hosts::openfx {
namespace {

constexpr double kLibraryFrameRate = 30.0;

// 0..255; not a number counts as 0.
std::uint32_t ColourByte(double channel) {
    if (!(channel > 0.0)) return 0;
    return static_cast<std::uint32_t>(std::lround(std::min(channel, 1.0) * 255.0));
}

// Hosts give rates as decimals; 23.976 and the like mean fractions.
std::optional<FrameRate> RateOf(std::optional<double> rate) {
    if (!rate || !std::isfinite(*rate)) return std::nullopt;
    return ParseRate(NumberText(*rate));
}

// Numbers as different as can be for starts that differ little.
std::uint32_t Scatter(std::uint32_t number) {
    number = (number ^ number >> 16) * 0x7FEB352Du;
    number = (number ^ number >> 15) * 0x846CA68Bu;
    return number ^ number >> 16;
}

}  // namespace

Instance::Instance(const Suites& suites, OfxImageEffectHandle handle, const effects::EffectTable& effect)
    : m_suites(suites), m_handle(handle), m_effect(effect), m_params(DescribeParams(effect)) {
    Require(suites.effect->getParamSet(handle, &m_paramSet));
    for (const PluginParam& param : m_params) m_handles.push_back(Param(param));
    m_source = Clip(kOfxImageEffectSimpleSourceClipName);
    m_output = Clip(kOfxImageEffectOutputClipName);
    OfxPropertySetHandle properties = nullptr;
    Require(suites.effect->getPropertySet(handle, &properties));
    if (Properties(suites, properties).Text(kOfxImageEffectPropContext) == kOfxImageEffectContextGeneral) {
        m_mask = Clip(kMaskClipName);
    }
}

OfxImageClipHandle Instance::Clip(const char* name) const {
    OfxImageClipHandle clip = nullptr;
    Require(m_suites.effect->clipGetHandle(m_handle, name, &clip, nullptr));
    return clip;
}

OfxParamHandle Instance::Param(const PluginParam& param) const {
    OfxParamHandle handle = nullptr;
    if (param.role != ParamRole::kGroup) {
        Require(m_suites.parameter->paramGetHandle(m_paramSet, param.name.c_str(), &handle, nullptr));
    }
    return handle;
}

OfxImageClipHandle Instance::Mask() const {
    OfxPropertySetHandle properties = nullptr;
    if (m_mask == nullptr || m_suites.effect->clipGetPropertySet(m_mask, &properties) != kOfxStatOK)
        return nullptr;
    return Properties(m_suites, properties).Int(kOfxImageClipPropConnected).value_or(0) != 0 ? m_mask
                                                                                             : nullptr;
}

OfxParamHandle Instance::Of(ParamRole role) const {
    const auto found = std::ranges::find(m_params, role, &PluginParam::role);
    return m_handles[static_cast<std::size_t>(found - m_params.begin())];
}

int Instance::IntOf(ParamRole role) const {
    int value = 0;
    Require(m_suites.parameter->paramGetValue(Of(role), &value));
    return value;
}

ValueWord Instance::OwnAt(std::size_t index, OfxTime time) const {
    const effects::ParamRow& row = m_effect.params[m_params[index].own];
    const auto read = [&](auto*... values) {
        Require(m_suites.parameter->paramGetValueAtTime(m_handles[index], time, values...));
    };
    int number = 0;
    double shown = 0.0, red = 0.0, green = 0.0, blue = 0.0;
    switch (row.kind) {
        case kKindSlider:
            read(&shown);
            return StoredSlider(row, shown);
        case kKindColour:
            read(&red, &green, &blue);
            return {.colour = ColourByte(red) | ColourByte(green) << 8 | ColourByte(blue) << 16};
        case kKindMenu:
            read(&number);
            return {.item = number};
        default:
            read(&number);
            return {.bits = number != 0 ? 1u : 0u};
    }
}

// Nothing for a parameter that is not animated, or when the host does not give its keys.
std::optional<ValueWord> Instance::LargestKey(std::size_t index) const {
    const OfxParameterSuiteV1& suite = *m_suites.parameter;
    unsigned int count = 0;
    if (suite.paramGetNumKeys == nullptr || suite.paramGetKeyTime == nullptr ||
        suite.paramGetNumKeys(m_handles[index], &count) != kOfxStatOK || count < 2) {
        return std::nullopt;
    }
    const bool isSlider = m_effect.params[m_params[index].own].kind == kKindSlider;
    std::optional<ValueWord> largest;
    for (unsigned int key = 0; key < count; ++key) {
        OfxTime time = 0.0;
        if (suite.paramGetKeyTime(m_handles[index], key, &time) != kOfxStatOK) continue;
        const ValueWord value = OwnAt(index, time);
        const bool isLarger =
            !largest || (isSlider ? value.number > largest->number : value.bits > largest->bits);
        if (isLarger) largest = value;
    }
    return largest;
}

FrameValues Instance::ValuesAt(OfxTime time) const {
    FrameValues values;
    for (std::size_t i = 0; i < m_params.size(); ++i) {
        if (m_params[i].role == ParamRole::kOwn) values.own[m_params[i].own] = OwnAt(i, time);
    }
    for (std::size_t i = 0; i < m_params.size(); ++i) {
        const auto largest = m_params[i].role == ParamRole::kOwn ? LargestKey(i) : std::nullopt;
        if (!largest) continue;
        if (!values.largest) values.largest = values.own;
        (*values.largest)[m_params[i].own] = *largest;
    }
    double percent = 100.0;
    Require(m_suites.parameter->paramGetValueAtTime(Of(ParamRole::kMix), time, &percent));
    values.mix = percent > 0.0 ? std::min(percent, 100.0) / 100.0 : 0.0;  // not a number: 0
    values.seed = static_cast<std::uint32_t>(std::max(IntOf(ParamRole::kSeed), 0));
    values.startFrame = IntOf(ParamRole::kStartFrame);
    const int space = IntOf(ParamRole::kWorkingSpace);
    values.space = static_cast<WorkingSpace>(std::clamp(space, 0, static_cast<int>(WorkingSpace::kNone)));
    return values;
}

double Instance::ClipSeconds(OfxTime time, int startFrame) const {
    constexpr double kLargestTime = 1e12;  // keeps sums and products exact
    OfxPropertySetHandle clip = nullptr, effect = nullptr;
    std::optional<FrameRate> rate;
    if (m_suites.effect->clipGetPropertySet(m_source, &clip) == kOfxStatOK) {
        rate = RateOf(Properties(m_suites, clip).Double(kOfxImageEffectPropFrameRate));
    }
    if (!rate && m_suites.effect->getPropertySet(m_handle, &effect) == kOfxStatOK) {
        rate = RateOf(Properties(m_suites, effect).Double(kOfxImageEffectPropFrameRate));
    }
    if (!std::isfinite(time)) time = 0.0;
    const double frame = startFrame + std::clamp(time, -kLargestTime, kLargestTime);
    if (!rate) return frame / kLibraryFrameRate;
    return frame * rate->denominator / rate->numerator;
}

void Instance::SetOwn(std::size_t index, ValueWord stored) const {
    const effects::ParamRow& row = m_effect.params[m_params[index].own];
    const auto set = [&](auto... values) {
        Require(m_suites.parameter->paramSetValue(m_handles[index], values...));
    };
    const auto channel = [&](int shift) { return (stored.colour >> shift & 0xFFu) / 255.0; };
    switch (row.kind) {
        case kKindSlider:
            set(ShownSlider(row, stored));
            break;
        case kKindColour:
            set(channel(0), channel(8), channel(16));
            break;
        case kKindMenu:
            set(static_cast<int>(stored.item));
            break;
        default:
            set(stored.flag != 0 ? 1 : 0);
            break;
    }
}

namespace {

// One step of the host's undo list, if it can make one of several changes. Ends also when a value cannot be set.
class EditBlock {
  public:
    EditBlock(const Suites& suites, OfxParamSetHandle params, const std::string& name)
        : m_suites(suites),
          m_params(params),
          m_isOpen(suites.parameter->paramEditBegin(params, name.c_str()) == kOfxStatOK) {}
    ~EditBlock() {
        if (m_isOpen) m_suites.parameter->paramEditEnd(m_params);
    }
    EditBlock(const EditBlock&) = delete;
    EditBlock& operator=(const EditBlock&) = delete;

  private:
    const Suites& m_suites;
    OfxParamSetHandle m_params;
    bool m_isOpen;
};

}  // namespace

void Instance::ApplyChosenPreset() const {
    const int item = IntOf(ParamRole::kPreset);
    if (item < 1 || static_cast<std::size_t>(item) > m_effect.presetNames.size()) return;
    const auto preset = static_cast<std::uint32_t>(item - 1);
    const EditBlock block(m_suites, m_paramSet, std::string("Preset ") + m_effect.presetNames[preset]);
    for (std::size_t i = 0; i < m_params.size(); ++i) {
        PresetCell cell;
        if (m_params[i].role != ParamRole::kOwn) continue;
        if (effects::CopyPresetValue(m_effect, preset, m_params[i].own, &cell)) SetOwn(i, cell.value);
    }
}

void Instance::DrawSeed() const {
    const int old = IntOf(ParamRole::kSeed);
    const std::uint32_t drawn = Scatter(support::TickCount() ^ Scatter(static_cast<std::uint32_t>(old)));
    auto seed = static_cast<int>(drawn >> 1);
    if (seed == old) seed ^= 1;
    const EditBlock block(m_suites, m_paramSet, "New seed");
    Require(m_suites.parameter->paramSetValue(Of(ParamRole::kSeed), seed));
}

Instance::Borrowed Instance::Session(const FrameValues& values) {
    std::unique_ptr<effects::EffectSession> session;
    {
        const std::scoped_lock lock(m_mutex);
        if (!m_sessions.empty()) {
            session = std::move(m_sessions.back());
            m_sessions.pop_back();
        }
    }
    if (session == nullptr) session = effects::EffectSession::Create(m_effect);
    if (session == nullptr) throw std::bad_alloc();
    const auto set = [&](const FrameValues::Own& own) {
        for (std::uint32_t i = 0; i < m_effect.params.size(); ++i) session->SetValue(i, own[i]);
    };
    session->ReleaseArrangement();
    if (values.largest) {
        // Else every frame of an animation would have scratches and flicker of its own.
        set(*values.largest);
        session->KeepArrangement();
    }
    set(values.own);
    session->PinRandom(values.seed);
    return {*this, std::move(session)};
}

Instance::Borrowed::~Borrowed() {
    try {
        const std::scoped_lock lock(m_owner.m_mutex);
        m_owner.m_sessions.push_back(std::move(m_session));
    } catch (const std::exception&) {
        // No memory to keep it.
        return;
    }
}

void Instance::FreeSessions() {
    const std::scoped_lock lock(m_mutex);
    m_sessions.clear();
}

}  // namespace velmora::hosts::openfx

#include "programs/reelcheck/openfx_objects.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <limits>
#include <mutex>

#include "programs/reelcheck/check.h"

namespace velmora::reelcheck {
namespace {

struct Registry {
    std::mutex mutex;
    std::map<const void*, Handled::Kind> living;
    std::vector<std::string> complaints;
    int falseHandles = 0;
};

Registry& TheRegistry() {
    static Registry registry;
    return registry;
}

const PropertyValue kInt = 0, kDouble = 0.0, kText = std::string(), kPointer = static_cast<void*>(nullptr);

struct KnownProperty {
    PropertySet::Of what;
    const char* name;
    PropertyValue empty;
    int dimension;
    bool isReadOnly = false;
};

// What the standard lists, as far as a filter has to do with it.
const std::vector<KnownProperty>& Known() {
    using enum PropertySet::Of;
    static const std::vector<KnownProperty> known = {
        {kHost, kOfxPropName, kText, 1, true},
        {kHost, kOfxPropLabel, kText, 1, true},
        {kDescriptor, kOfxPropLabel, kText, 1},
        {kDescriptor, kOfxPropPluginDescription, kText, 1},
        {kDescriptor, kOfxImageEffectPluginPropGrouping, kText, 1},
        {kDescriptor, kOfxImageEffectPropSupportedContexts, kText, 0},
        {kDescriptor, kOfxImageEffectPropSupportedPixelDepths, kText, 0},
        {kDescriptor, kOfxImageEffectPluginPropSingleInstance, kInt, 1},
        {kDescriptor, kOfxImageEffectPluginPropHostFrameThreading, kInt, 1},
        {kDescriptor, kOfxImageEffectPluginRenderThreadSafety, kText, 1},
        {kDescriptor, kOfxImageEffectPropSupportsMultiResolution, kInt, 1},
        {kDescriptor, kOfxImageEffectPropSupportsTiles, kInt, 1},
        {kDescriptor, kOfxImageEffectPropTemporalClipAccess, kInt, 1},
        {kDescriptor, kOfxImageEffectPluginPropFieldRenderTwiceAlways, kInt, 1},
        {kDescriptor, kOfxImageEffectPropSupportsMultipleClipDepths, kInt, 1},
        {kDescriptor, kOfxImageEffectPropSupportsMultipleClipPARs, kInt, 1},
        {kInstance, kOfxImageEffectPropContext, kText, 1, true},
        {kInstance, kOfxImageEffectPropFrameRate, kDouble, 1, true},
        {kInstance, kOfxPropInstanceData, kPointer, 1},
        {kClip, kOfxImageEffectPropSupportedComponents, kText, 0},
        {kClip, kOfxImageEffectPropSupportsTiles, kInt, 1},
        {kClip, kOfxImageClipPropOptional, kInt, 1},
        {kClip, kOfxImageClipPropIsMask, kInt, 1},
        {kClip, kOfxImageClipPropFieldExtraction, kText, 1},
        {kClip, kOfxImageClipPropConnected, kInt, 1, true},
        {kClip, kOfxImageEffectPropFrameRate, kDouble, 1, true},
        {kImage, kOfxImageEffectPropPixelDepth, kText, 1, true},
        {kImage, kOfxImageEffectPropComponents, kText, 1, true},
        {kImage, kOfxImageEffectPropPreMultiplication, kText, 1, true},
        {kImage, kOfxImagePropData, kPointer, 1, true},
        {kImage, kOfxImagePropBounds, kInt, 4, true},
        {kImage, kOfxImagePropRegionOfDefinition, kInt, 4, true},
        {kImage, kOfxImagePropRowBytes, kInt, 1, true},
        {kParam, kOfxPropLabel, kText, 1},
        {kParam, kOfxParamPropHint, kText, 1},
        {kParam, kOfxParamPropParent, kText, 1},
        {kParam, kOfxParamPropAnimates, kInt, 1},
        {kParam, kOfxParamPropEvaluateOnChange, kInt, 1},
        {kParamSet, kOfxPluginPropParamPageOrder, kText, 0},
    };
    return known;
}

}  // namespace

void Complain(const std::string& text) {
    const std::scoped_lock lock(TheRegistry().mutex);
    TheRegistry().complaints.push_back(text);
}

void RequireNoComplaints() {
    std::vector<std::string> complaints;
    {
        const std::scoped_lock lock(TheRegistry().mutex);
        complaints.swap(TheRegistry().complaints);
    }
    if (!complaints.empty()) Fail(complaints.front());
}

FalseHandles::FalseHandles() noexcept {
    ++TheRegistry().falseHandles;
}
FalseHandles::~FalseHandles() {
    --TheRegistry().falseHandles;
}

Handled::Handled(Kind kind) {
    const std::scoped_lock lock(TheRegistry().mutex);
    TheRegistry().living[this] = kind;
}
Handled::~Handled() {
    const std::scoped_lock lock(TheRegistry().mutex);
    TheRegistry().living.erase(this);
}

bool Handled::IsLiving(const void* handle, Kind kind) {
    Registry& registry = TheRegistry();
    const std::scoped_lock lock(registry.mutex);
    const auto found = registry.living.find(handle);
    const bool isLiving = found != registry.living.end() && found->second == kind;
    if (!isLiving && registry.falseHandles == 0) registry.complaints.emplace_back("uses an invalid handle");
    return isLiving;
}

PropertySet::PropertySet(Of what) : Handled(kKind) {
    for (const KnownProperty& known : Known()) {
        if (known.what == what)
            m_properties[known.name] = {known.empty, known.dimension, known.isReadOnly, {}};
    }
}

PropertySet::Property* PropertySet::Find(const char* name) {
    const auto found = m_properties.find(std::string_view(name));
    return found != m_properties.end() ? &found->second : nullptr;
}

void PropertySet::Put(const char* name, std::vector<PropertyValue> values) {
    m_properties.at(name).values = std::move(values);
}

void PropertySet::Add(const char* name, int dimension, std::vector<PropertyValue> values) {
    const PropertyValue first = values.front();
    PropertyValue empty = kInt;
    if (std::holds_alternative<double>(first)) empty = kDouble;
    if (std::holds_alternative<std::string>(first)) empty = kText;
    m_properties[name] = {empty, dimension, false, std::move(values)};
}

const std::vector<PropertyValue>& PropertySet::Values(const char* name) {
    static const std::vector<PropertyValue> none;
    const Property* const property = Find(name);
    return property != nullptr ? property->values : none;
}

std::string PropertySet::Text(const char* name) {
    const auto& values = Values(name);
    return values.empty() ? std::string() : std::get<std::string>(values.front());
}

double PropertySet::Number(const char* name, std::size_t index) {
    const auto& values = Values(name);
    if (index >= values.size()) Fail(std::string(name) + " is not set");
    const int* const whole = std::get_if<int>(&values[index]);
    return whole != nullptr ? *whole : std::get<double>(values[index]);
}

int PropertySet::Count(const char* name) {
    return static_cast<int>(Values(name).size());
}

int HostParam::Dimension() const {
    if (type == kOfxParamTypeRGB) return 3;
    return type == kOfxParamTypeGroup || type == kOfxParamTypePage || type == kOfxParamTypePushButton ? 0 : 1;
}

bool HostParam::IsDouble() const {
    return type == kOfxParamTypeDouble || type == kOfxParamTypeRGB;
}

std::unique_ptr<HostParam> HostParam::NewInstance() {
    auto instance = std::make_unique<HostParam>(type, name);
    for (int i = 0; i < Dimension(); ++i) {
        instance->values[i] = properties.Number(kOfxParamPropDefault, static_cast<std::size_t>(i));
    }
    return instance;
}

HostParam* HostParamSet::Find(std::string_view name) const {
    const auto found = std::ranges::find_if(params, [&](const auto& param) { return param->name == name; });
    return found != params.end() ? found->get() : nullptr;
}

HostPicture* HostClip::At(double time) const {
    const auto found = m_pictures.find(time);
    return found != m_pictures.end() ? found->second : m_always;
}

HostEffect::HostEffect(bool isInstance)
    : Handled(kKind), properties(isInstance ? PropertySet::Of::kInstance : PropertySet::Of::kDescriptor) {
    params.isDescriptor = !isInstance;
}

HostClip* HostEffect::Find(std::string_view name) const {
    const auto found = std::ranges::find_if(clips, [&](const auto& clip) { return clip->name == name; });
    return found != clips.end() ? found->get() : nullptr;
}

HostState& State() {
    static HostState state;
    return state;
}

}  // namespace velmora::reelcheck

// The plug-ins' entry points. What a host has set is the only thing that they share; everything else that changes is in
// the instances.

#include <array>
#include <atomic>
#include <exception>
#include <memory>
#include <new>
#include <string_view>
#include <utility>

#include "api/host_api.h"
#include "faces/openfx/actions.h"
#include "faces/openfx/instance.h"

#ifdef _WIN32
#define VELMORA_EXPORT
#else
#define VELMORA_EXPORT __attribute__((visibility("default")))
#endif

namespace velmora::hosts::openfx {
namespace {

constexpr int kPluginCount = static_cast<int>(effects::kAllEffects.size());

constinit std::array<std::atomic<const OfxHost*>, effects::kAllEffects.size()> g_hosts = {};

struct Call {
    const Suites& suites;
    const effects::EffectTable& effect;
    OfxImageEffectHandle handle;
    Properties in, out;
};

Properties InstanceProperties(const Call& call) {
    OfxPropertySetHandle handle = nullptr;
    Require(call.suites.effect->getPropertySet(call.handle, &handle));
    return {call.suites, handle};
}

Instance& InstanceOf(const Call& call) {
    auto* const instance = static_cast<Instance*>(InstanceProperties(call).Pointer(kOfxPropInstanceData));
    if (instance == nullptr) throw ActionFailed{kOfxStatErrBadHandle};
    return *instance;
}

OfxStatus DoNothing(const Call&) {
    return kOfxStatOK;
}

OfxStatus DoDescribe(const Call& call) {
    Describe(call.suites, call.handle, call.effect);
    return kOfxStatOK;
}

OfxStatus DoDescribeInContext(const Call& call) {
    DescribeInContext(call.suites, call.handle, call.effect, call.in.Text(kOfxImageEffectPropContext));
    return kOfxStatOK;
}

OfxStatus DoCreate(const Call& call) {
    auto instance = std::make_unique<Instance>(call.suites, call.handle, call.effect);
    InstanceProperties(call).SetPointer(kOfxPropInstanceData, instance.get());
    static_cast<void>(instance.release());  // the host keeps it
    return kOfxStatOK;
}

OfxStatus DoDestroy(const Call& call) {
    const std::unique_ptr<Instance> instance(&InstanceOf(call));
    InstanceProperties(call).SetPointer(kOfxPropInstanceData, nullptr);
    return kOfxStatOK;
}

OfxStatus DoInstanceChanged(const Call& call) {
    const Instance& instance = InstanceOf(call);
    if (call.in.Text(kOfxPropType) != kOfxTypeParameter ||
        call.in.Text(kOfxPropChangeReason) != kOfxChangeUserEdited) {
        return kOfxStatReplyDefault;
    }
    const std::string_view name = call.in.Text(kOfxPropName);
    if (name == "preset") return instance.ApplyChosenPreset(), kOfxStatOK;
    if (name == "newSeed") return instance.DrawSeed(), kOfxStatOK;
    return kOfxStatReplyDefault;
}

OfxStatus DoPurge(const Call& call) {
    InstanceOf(call).FreeSessions();
    return kOfxStatOK;
}

OfxStatus DoClipPreferences(const Call& call) {
    call.out.Offer(kOfxImageEffectFrameVarying, IsFrameVarying(call.effect) ? 1 : 0);
    return kOfxStatOK;
}

OfxStatus DoRegionOfDefinition(const Call& call) {
    return AnswerRegionOfDefinition(InstanceOf(call), call.in, call.out);
}
OfxStatus DoRegionsOfInterest(const Call& call) {
    return AnswerRegionsOfInterest(InstanceOf(call), call.in, call.out);
}
OfxStatus DoIsIdentity(const Call& call) {
    return AnswerIsIdentity(InstanceOf(call), call.in, call.out);
}
OfxStatus DoRender(const Call& call) {
    return RenderFrame(InstanceOf(call), call.in);
}

struct Action {
    const char* name;
    OfxStatus (*run)(const Call&);
    bool hasHandle;  // of a descriptor or an instance
};

// The other actions have the host's usual answer.
constexpr Action kActions[] = {
    {kOfxActionLoad, DoNothing, false},
    {kOfxActionUnload, DoNothing, false},
    {kOfxActionDescribe, DoDescribe, true},
    {kOfxImageEffectActionDescribeInContext, DoDescribeInContext, true},
    {kOfxActionCreateInstance, DoCreate, true},
    {kOfxActionDestroyInstance, DoDestroy, true},
    {kOfxActionInstanceChanged, DoInstanceChanged, true},
    {kOfxActionPurgeCaches, DoPurge, true},
    {kOfxImageEffectActionGetClipPreferences, DoClipPreferences, true},
    {kOfxImageEffectActionGetRegionOfDefinition, DoRegionOfDefinition, true},
    {kOfxImageEffectActionGetRegionsOfInterest, DoRegionsOfInterest, true},
    {kOfxImageEffectActionIsIdentity, DoIsIdentity, true},
    {kOfxImageEffectActionBeginSequenceRender, DoNothing, true},
    {kOfxImageEffectActionRender, DoRender, true},
    {kOfxImageEffectActionEndSequenceRender, DoNothing, true},
};

// No exception may reach a host.
OfxStatus Run(int plugin, const char* name, const void* handle, OfxPropertySetHandle in,
              OfxPropertySetHandle out) noexcept {
    try {
        if (name == nullptr) return kOfxStatErrValue;
        const auto index = static_cast<std::size_t>(plugin);
        for (const Action& action : kActions) {
            if (std::string_view(name) != action.name) continue;
            const Suites suites = FetchSuites(g_hosts[index].load());
            if (action.hasHandle && handle == nullptr) return kOfxStatErrBadHandle;
            // The interface has one handle type for all actions, a constant one.
            auto* const effect = static_cast<OfxImageEffectHandle>(const_cast<void*>(handle));
            return action.run({suites, *effects::kAllEffects[index], effect, {suites, in}, {suites, out}});
        }
        return kOfxStatReplyDefault;
    } catch (const ActionFailed& failure) {
        return failure.status;
    } catch (const std::bad_alloc&) {
        return kOfxStatErrMemory;
    } catch (...) {
        return kOfxStatFailed;
    }
}

// The host names no plug-in when it calls one, so each has functions of its own.
template <int kPlugin>
void SetHost(OfxHost* host) {
    g_hosts[kPlugin] = host;
}
template <int kPlugin>
OfxStatus MainEntry(const char* action, const void* handle, OfxPropertySetHandle in,
                    OfxPropertySetHandle out) {
    return Run(kPlugin, action, handle, in, out);
}

constexpr std::array kIdentifiers = {"example.velmora.FilmCamera", "example.velmora.FilmLook",
                                     "example.velmora.FilmDamage", "example.velmora.FilmExpress",
                                     "example.velmora.FilmPro"};
static_assert(kIdentifiers.size() == effects::kAllEffects.size());

template <int... kPlugins>
constexpr std::array<OfxPlugin, sizeof...(kPlugins)> MakePlugins(std::integer_sequence<int, kPlugins...>) {
    return {OfxPlugin{kOfxImageEffectPluginApi, kOfxImageEffectPluginApiVersion, kIdentifiers[kPlugins],
                      kReelEffectsMajor, kReelEffectsMinor, SetHost<kPlugins>, MainEntry<kPlugins>}...};
}

constinit std::array<OfxPlugin, kPluginCount> g_plugins =
    MakePlugins(std::make_integer_sequence<int, kPluginCount>());

}  // namespace
}  // namespace velmora::hosts::openfx

extern "C" {

VELMORA_EXPORT int OfxGetNumberOfPlugins() {
    return velmora::hosts::openfx::kPluginCount;
}

VELMORA_EXPORT OfxPlugin* OfxGetPlugin(int nth) {
    using namespace velmora::hosts::openfx;
    return nth >= 0 && nth < kPluginCount ? &g_plugins[static_cast<std::size_t>(nth)] : nullptr;
}

}  // extern "C"

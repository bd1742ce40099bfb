// What the OpenFX plug-ins say about themselves, and what they do with a host that is not as it should be.

#include <algorithm>
#include <cmath>
#include <set>

#include "effects/effect_queries.h"
#include "programs/reelcheck/checks.h"
#include "programs/reelcheck/openfx_host.h"
#include "programs/reelcheck/system.h"
#include "text/names.h"

namespace velmora::reelcheck {
namespace {

constexpr const char* kContexts[] = {kOfxImageEffectContextFilter, kOfxImageEffectContextGeneral};
constexpr const char* kActions[] = {kOfxActionLoad,
                                    kOfxActionUnload,
                                    kOfxActionDescribe,
                                    kOfxImageEffectActionDescribeInContext,
                                    kOfxActionCreateInstance,
                                    kOfxActionDestroyInstance,
                                    kOfxActionInstanceChanged,
                                    kOfxActionPurgeCaches,
                                    kOfxActionSyncPrivateData,
                                    kOfxImageEffectActionGetRegionOfDefinition,
                                    kOfxImageEffectActionGetRegionsOfInterest,
                                    kOfxImageEffectActionGetClipPreferences,
                                    kOfxImageEffectActionIsIdentity,
                                    kOfxImageEffectActionBeginSequenceRender,
                                    kOfxImageEffectActionRender,
                                    kOfxImageEffectActionEndSequenceRender,
                                    "NoSuchAction"};

bool Has(PropertySet& set, const char* name, const char* value) {
    return std::ranges::find(set.Values(name), PropertyValue(std::string(value))) != set.Values(name).end();
}

void CheckRange(HostParam& param) {
    PropertySet& p = param.properties;
    const double minimum = p.Number(kOfxParamPropMin), maximum = p.Number(kOfxParamPropMax);
    const double standard = p.Number(kOfxParamPropDefault);
    Require(minimum < maximum && standard >= minimum && standard <= maximum, "a default outside its range");
    if (param.type == kOfxParamTypeDouble) {
        Require(p.Number(kOfxParamPropDisplayMin) == minimum && p.Number(kOfxParamPropDisplayMax) == maximum,
                "another range shown than allowed");
        Require(p.Number(kOfxParamPropDigits) >= 0 && p.Number(kOfxParamPropIncrement) > 0,
                "no digits or increment");
    }
}

void CheckParam(HostEffect& effect, HostParam& param) {
    SetPlace("%s", param.name.c_str());
    PropertySet& p = param.properties;
    Require(!p.Text(kOfxPropLabel).empty(), "no label");
    const bool isContainer = param.type == kOfxParamTypeGroup || param.type == kOfxParamTypePage;
    Require(isContainer || !p.Text(kOfxParamPropHint).empty(), "no hint");
    if (param.type == kOfxParamTypeDouble || param.type == kOfxParamTypeInteger) CheckRange(param);
    if (param.type == kOfxParamTypeChoice) {
        const double standard = p.Number(kOfxParamPropDefault);
        Require(standard >= 0 && standard < p.Count(kOfxParamPropChoiceOption), "a default outside the menu");
    }
    if (const std::string parent = p.Text(kOfxParamPropParent); !parent.empty()) {
        const HostParam* const group = effect.params.Find(parent);
        Require(group != nullptr && group->type == kOfxParamTypeGroup, "a parent that is no group");
    }
    for (const PropertyValue& child : p.Values(kOfxParamPropPageChild)) {
        Require(effect.params.Find(std::get<std::string>(child)) != nullptr, "a page with an unknown child");
    }
}

// Every parameter that a user can set is on one page, and those of the effect are as in its table.
void CheckParams(HostEffect& effect, const effects::EffectTable& table) {
    std::multiset<std::string> onPages;
    for (const auto& param : effect.params.params) {
        CheckParam(effect, *param);
        if (param->type == kOfxParamTypePage) {
            for (const PropertyValue& child : param->properties.Values(kOfxParamPropPageChild)) {
                onPages.insert(std::get<std::string>(child));
            }
        }
    }
    for (const auto& param : effect.params.params) {
        if (param->Dimension() > 0 && onPages.count(param->name) != 1)
            Fail(param->name + " is not on one page");
    }
    for (std::uint32_t i = 0; i < table.params.size(); ++i) {
        if (!effects::HoldsValue(table.params[i])) continue;
        const std::string title = effects::UniqueName(table, table.params[i]);
        const auto isIt = [&](const auto& param) { return IsSameName(param->name, title); };
        Require(std::ranges::any_of(effect.params.params, isIt), ("no parameter is called " + title).c_str());
    }
    HostParam* const preset = effect.params.Find("preset");
    Require(preset != nullptr && preset->properties.Count(kOfxParamPropChoiceOption) ==
                                     static_cast<int>(table.presetNames.size()) + 1,
            "the presets are not those of the table");
}

void CheckDescriptor(PropertySet& p) {
    for (const char* context : kContexts)
        Require(Has(p, kOfxImageEffectPropSupportedContexts, context), context);
    for (const char* depth : {kOfxBitDepthByte, kOfxBitDepthShort, kOfxBitDepthFloat}) {
        Require(Has(p, kOfxImageEffectPropSupportedPixelDepths, depth), depth);
    }
    Require(!p.Text(kOfxPropLabel).empty() && !p.Text(kOfxImageEffectPluginPropGrouping).empty(), "no name");
    Require(p.Text(kOfxImageEffectPluginRenderThreadSafety) == kOfxImageEffectRenderFullySafe,
            "not safe in threads");
}

}  // namespace

void CheckOpenfxExports(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    Require(module.Count() == static_cast<int>(effects::kAllEffects.size()),
            "not one plug-in for each effect");
    Require(module.Get(-1) == nullptr && module.Get(module.Count()) == nullptr, "a plug-in outside the list");
    std::set<std::string> identifiers;
    for (int i = 0; i < module.Count(); ++i) {
        const OfxPlugin& plugin = *module.Get(i);
        Require(std::string(plugin.pluginApi) == kOfxImageEffectPluginApi && plugin.apiVersion == 1,
                "another interface");
        identifiers.insert(plugin.pluginIdentifier);
    }
    Require(static_cast<int>(identifiers.size()) == module.Count(), "two plug-ins with one identifier");
}

void CheckOpenfxDescriptions(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    for (int i = 0; i < module.Count(); ++i) {
        OpenfxPlugin plugin(module, i);
        SetPlace("%s", plugin.Effect().name);
        CheckDescriptor(plugin.Descriptor().properties);
        for (const char* name : kContexts) {
            const auto effect = plugin.DescribedIn(name);
            const bool isGeneral = name == kContexts[1];
            Require((effect->Find("Mask") != nullptr) == isGeneral, "a mask in the wrong context");
            for (const char* clip : {"Source", "Output"}) {
                Require(effect->Find(clip) != nullptr, clip);
                PropertySet& p = effect->Find(clip)->properties;
                Require(Has(p, kOfxImageEffectPropSupportedComponents, kOfxImageComponentRGB) &&
                            Has(p, kOfxImageEffectPropSupportedComponents, kOfxImageComponentRGBA),
                        "not both components");
            }
            CheckParams(*effect, plugin.Effect());
        }
    }
    RequireNothingHeld();
}

void CheckOpenfxMissingSuites(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    OfxPlugin& plugin = *module.Get(module.Count() - 1);
    HostEffect descriptor(false);
    const auto expectMissing = [&](const char* what) {
        for (const char* action : kActions) {
            const bool isUnknown = std::string_view(action) == "NoSuchAction" ||
                                   std::string_view(action) == kOfxActionSyncPrivateData;
            const OfxStatus expected = isUnknown ? kOfxStatReplyDefault : kOfxStatErrMissingHostFeature;
            SetPlace("%s, %s", what, action);
            const OfxStatus status = plugin.mainEntry(action, descriptor.Handle(), nullptr, nullptr);
            if (status != expected) Fail(Text("status %d, not %d", status, expected));
        }
    };
    expectMissing("before a host is set");
    plugin.setHost(nullptr);
    expectMissing("without a host");
    OfxHost empty = {nullptr, nullptr};
    plugin.setHost(&empty);
    expectMissing("with a host without functions");
    plugin.setHost(TheOfxHost());
    for (const char* suite : {kOfxPropertySuite, kOfxImageEffectSuite, kOfxParameterSuite}) {
        State().missingSuite = suite;
        for (const bool isEmpty : {false, true}) {
            State().hasEmptySuite = isEmpty;
            expectMissing(suite);
        }
    }
    State().missingSuite.clear();
    State().hasEmptySuite = false;
    RequireNothingHeld();
}

void CheckOpenfxWrongHandles(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    int dummy = 0;
    for (int i = 0; i < module.Count(); ++i) {
        const OpenfxPlugin plugin(module, i);
        HostEffect descriptor(false), noData(true);
        noData.properties.Put(kOfxPropInstanceData, {static_cast<void*>(nullptr)});
        const FalseHandles falseHandles;
        const void* const handles[] = {nullptr, &dummy, &noData, &descriptor};
        for (const char* action : kActions) {
            for (const void* handle : handles) {
                SetPlace("%s, %s", plugin.Effect().name, action);
                Arguments empty, out;
                for (Arguments* in : {static_cast<Arguments*>(nullptr), &empty}) {
                    const OfxStatus status = plugin.Call(action, handle, in, in == nullptr ? nullptr : &out);
                    Require(status >= kOfxStatOK && status <= kOfxStatErrImageFormat, "no status");
                    const bool needsHandle =
                        std::string_view(action) == kOfxImageEffectActionRender || action == kActions[4];
                    Require(!needsHandle || handle == &descriptor || status == kOfxStatErrBadHandle ||
                                status == kOfxStatErrUnknown,
                            "a wrong handle is taken");
                }
            }
        }
        Require(plugin.Call(nullptr, nullptr) != kOfxStatOK, "a null action succeeds");
        Arguments in;
        in.Add(kOfxImageEffectPropContext, {std::string("OfxImageEffectContextPaint")});
        plugin.Expect(kOfxStatErrUnsupported, kOfxImageEffectActionDescribeInContext, descriptor.Handle(),
                      &in);
    }
    State().images = 0;
    try {
        RequireNoComplaints();
    } catch (const CheckFailed&) {
        // With handles that are none, anything may be asked for.
    }
}

void CheckOpenfxLoading(CheckContext& context) {
    const auto visit = [&](bool isDescribed) {
        const OpenfxModule module(context.bundlePath);
        if (!isDescribed) return;
        const OpenfxPlugin plugin(module, module.Count() - 1);
        OpenfxInstance instance(plugin);
        HostPicture source({}), output({});
        source.Paint(context.dice);
        instance.ChoosePreset(0);
        instance.RenderWhole(source, output, 1.0);
    };
    for (int i = 0; i < 10; ++i) visit(true);
    const ProcessFigures before = FiguresNow();
    const int rounds = context.Rounds(100, 2000);
    for (int i = 0; i < rounds; ++i) {
        SetPlace("round %d", i);
        visit(i % 3 != 0);
    }
    RequireNoGrowth(before, FiguresNow(), std::int64_t{1} << 20);
    RequireNothingHeld();
}

}  // namespace velmora::reelcheck

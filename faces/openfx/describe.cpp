#include <string>

#include "faces/openfx/actions.h"
#include "faces/openfx/plugin_params.h"
#include "platform/platform.h"

namespace velmora::hosts::openfx {
namespace {

Properties PropertiesOf(const Suites& suites, OfxImageEffectHandle effect) {
    OfxPropertySetHandle handle = nullptr;
    Require(suites.effect->getPropertySet(effect, &handle));
    return {suites, handle};
}

Properties DefineClip(const Suites& suites, OfxImageEffectHandle effect, const char* name) {
    OfxPropertySetHandle handle = nullptr;
    Require(suites.effect->clipDefine(effect, name, &handle));
    Properties clip(suites, handle);
    clip.Offer(kOfxImageEffectPropSupportsTiles, 1);
    return clip;
}

void DefinePicture(const Suites& suites, OfxImageEffectHandle effect, const char* name) {
    const Properties clip = DefineClip(suites, effect, name);
    clip.Set(kOfxImageEffectPropSupportedComponents, kOfxImageComponentRGBA, 0);
    clip.Set(kOfxImageEffectPropSupportedComponents, kOfxImageComponentRGB, 1);
    // A field is a picture of its own, as high as a frame.
    clip.Offer(kOfxImageClipPropFieldExtraction, kOfxImageFieldDoubled);
}

void DefineMask(const Suites& suites, OfxImageEffectHandle effect) {
    const Properties clip = DefineClip(suites, effect, kMaskClipName);
    clip.Set(kOfxImageEffectPropSupportedComponents, kOfxImageComponentAlpha, 0);
    clip.Set(kOfxImageEffectPropSupportedComponents, kOfxImageComponentRGBA, 1);
    clip.Set(kOfxImageClipPropOptional, 1);
    clip.Offer(kOfxImageClipPropIsMask, 1);
}

class ParamDefiner {
  public:
    ParamDefiner(const Suites& suites, OfxImageEffectHandle effect) : m_suites(suites) {
        Require(suites.effect->getParamSet(effect, &m_params));
    }

    void Define(const PluginParam& param, const effects::EffectTable& effect) const {
        const Properties properties = Define(param.type, param.name);
        properties.Set(kOfxPropLabel, LabelOf(m_language, param.label).c_str());
        if (!param.hint.empty()) properties.Offer(kOfxParamPropHint, param.hint.c_str());
        if (!param.parent.empty()) properties.Offer(kOfxParamPropParent, param.parent.c_str());
        DefineValue(param, effect, properties);
        DefineUse(param, properties);
    }

    // A page of the parameters from `first` to before `end`, without groups.
    void DefinePage(const char* identifier, const char* label, const std::vector<PluginParam>& params,
                    std::size_t first, std::size_t end, int place) const {
        const Properties page = Define(kOfxParamTypePage, identifier);
        page.Set(kOfxPropLabel, LabelOf(m_language, label).c_str());
        int child = 0;
        for (std::size_t i = first; i < end; ++i) {
            if (params[i].role == ParamRole::kGroup) continue;
            page.Offer(kOfxParamPropPageChild, params[i].name.c_str(), child++);
        }
        OfxPropertySetHandle handle = nullptr;
        Require(m_suites.parameter->paramSetGetPropertySet(m_params, &handle));
        Properties(m_suites, handle).Offer(kOfxPluginPropParamPageOrder, identifier, place);
    }

  private:
    [[nodiscard]] Properties Define(const char* type, const std::string& name) const {
        OfxPropertySetHandle handle = nullptr;
        Require(m_suites.parameter->paramDefine(m_params, type, name.c_str(), &handle));
        return {m_suites, handle};
    }

    void DefineValue(const PluginParam& param, const effects::EffectTable& effect,
                     const Properties& properties) const {
        const std::string_view type = param.type;
        const int standard = static_cast<int>(param.standard);
        if (type == kOfxParamTypeDouble) {
            properties.Set(kOfxParamPropDefault, param.standard);
            DefineRange(param, properties);
        } else if (type == kOfxParamTypeInteger) {
            properties.Set(kOfxParamPropDefault, standard);
            properties.Set(kOfxParamPropMin, static_cast<int>(param.minimum));
            properties.Set(kOfxParamPropMax, static_cast<int>(param.maximum));
        } else if (type == kOfxParamTypeChoice) {
            for (std::size_t i = 0; i < param.choices.size(); ++i) {
                // A preset's name is a name.
                const bool isNamed = param.role == ParamRole::kPreset && i > 0;
                const std::string item = isNamed ? param.choices[i] : LabelOf(m_language, param.choices[i]);
                properties.Set(kOfxParamPropChoiceOption, item.c_str(), static_cast<int>(i));
            }
            properties.Set(kOfxParamPropDefault, standard);
        } else if (type == kOfxParamTypeBoolean) {
            properties.Set(kOfxParamPropDefault, standard);
        } else if (type == kOfxParamTypeRGB) {
            const std::uint32_t word = effect.params[param.own].defaultValue.colour;
            for (int i = 0; i < 3; ++i) {
                properties.Set(kOfxParamPropDefault, (word >> (8 * i) & 0xFFu) / 255.0, i);
            }
        }
    }

    static void DefineRange(const PluginParam& param, const Properties& properties) {
        const double range = param.maximum - param.minimum;
        properties.Set(kOfxParamPropMin, param.minimum);
        properties.Set(kOfxParamPropMax, param.maximum);
        properties.Offer(kOfxParamPropDisplayMin, param.minimum);
        properties.Offer(kOfxParamPropDisplayMax, param.maximum);
        properties.Offer(kOfxParamPropIncrement, range / 100.0);
        properties.Offer(kOfxParamPropDigits, 1);
    }

    // The common parameters but the mix stand still; preset and button change the picture only through others.
    static void DefineUse(const PluginParam& param, const Properties& properties) {
        const bool isOwn = param.role == ParamRole::kOwn || param.role == ParamRole::kGroup;
        if (!isOwn && param.role != ParamRole::kMix) properties.Offer(kOfxParamPropAnimates, 0);
        if (param.role == ParamRole::kPreset || param.role == ParamRole::kNewSeed) {
            properties.Offer(kOfxParamPropEvaluateOnChange, 0);
        }
    }

    const Suites& m_suites;
    const std::string m_language = support::UserLanguage();
    OfxParamSetHandle m_params = nullptr;
};

}  // namespace

void Describe(const Suites& suites, OfxImageEffectHandle descriptor, const effects::EffectTable& effect) {
    const Properties plugin = PropertiesOf(suites, descriptor);
    plugin.Set(kOfxPropLabel, effect.name);
    plugin.Offer(kOfxImageEffectPluginPropGrouping, "Velmora");
    plugin.Offer(kOfxPropPluginDescription, "The look of old film, with the same result in every host.");
    plugin.Set(kOfxImageEffectPropSupportedContexts, kOfxImageEffectContextFilter, 0);
    plugin.Set(kOfxImageEffectPropSupportedContexts, kOfxImageEffectContextGeneral, 1);
    plugin.Set(kOfxImageEffectPropSupportedPixelDepths, kOfxBitDepthFloat, 0);
    plugin.Set(kOfxImageEffectPropSupportedPixelDepths, kOfxBitDepthShort, 1);
    plugin.Set(kOfxImageEffectPropSupportedPixelDepths, kOfxBitDepthByte, 2);
    // Where a host knows none of these, its default is right or at least safe.
    plugin.Offer(kOfxImageEffectPluginPropSingleInstance, 0);
    plugin.Offer(kOfxImageEffectPluginPropHostFrameThreading, 0);
    plugin.Offer(kOfxImageEffectPluginRenderThreadSafety, kOfxImageEffectRenderFullySafe);
    plugin.Offer(kOfxImageEffectPropSupportsMultiResolution, 1);
    // Diffusion and jitter read the picture far from where they write: with them a tile asks for the whole picture
    // (AnswerRegionsOfInterest).
    plugin.Offer(kOfxImageEffectPropSupportsTiles, 1);
    plugin.Offer(kOfxImageEffectPropTemporalClipAccess, 0);
    plugin.Offer(kOfxImageEffectPluginPropFieldRenderTwiceAlways, 0);
    plugin.Offer(kOfxImageEffectPropSupportsMultipleClipDepths, 0);
    plugin.Offer(kOfxImageEffectPropSupportsMultipleClipPARs, 0);
}

void DescribeInContext(const Suites& suites, OfxImageEffectHandle descriptor,
                       const effects::EffectTable& effect, std::string_view context) {
    if (context != kOfxImageEffectContextFilter && context != kOfxImageEffectContextGeneral) {
        throw ActionFailed{kOfxStatErrUnsupported};
    }
    DefinePicture(suites, descriptor, kOfxImageEffectOutputClipName);
    DefinePicture(suites, descriptor, kOfxImageEffectSimpleSourceClipName);
    // A filter has one input.
    if (context == kOfxImageEffectContextGeneral) DefineMask(suites, descriptor);

    const std::vector<PluginParam> params = DescribeParams(effect);
    const ParamDefiner definer(suites, descriptor);
    std::size_t common = 0;  // the first of the parameters that all plug-ins have
    while (params[common].role != ParamRole::kMix) ++common;
    for (const PluginParam& param : params) definer.Define(param, effect);
    definer.DefinePage("effectPage", effect.name, params, 0, common, 0);
    definer.DefinePage("renderPage", "Rendering", params, common, params.size(), 1);
}

}  // namespace velmora::hosts::openfx

#include "programs/reelcheck/openfx_host.h"

#include <algorithm>
#include <cstring>
#include <filesystem>

#include "platform/platform.h"
#include "programs/reelcheck/check.h"

namespace velmora::reelcheck {
namespace {

#ifdef _WIN32
constexpr char kSystemFolder[] = "Win64";
#else
constexpr char kSystemFolder[] = "Linux-x86-64";
#endif

std::filesystem::path FileOf(const std::string& path) {
    std::filesystem::path file = path;
    if (path.empty())
        file = std::filesystem::path(support::ModuleFolder(nullptr)) / "VelmoraReelEffects.ofx.bundle";
    if (std::filesystem::is_directory(file))
        file = file / "Contents" / kSystemFolder / "VelmoraReelEffects.ofx";
    return file;
}

template <typename Function>
Function Export(void* module, const char* name) {
    void* const address = support::FindExport(module, name);
    if (address == nullptr) Fail(Text("the export %s is missing", name));
    return reinterpret_cast<Function>(address);
}

PropertySet& HostProperties() {
    static PropertySet properties(PropertySet::Of::kHost);
    return properties;
}

const void* FetchSuite(OfxPropertySetHandle host, const char* name, int version) {
    static const OfxPropertySuiteV1 noProperties = {};
    static const OfxImageEffectSuiteV1 noEffects = {};
    static const OfxParameterSuiteV1 noParameters = {};
    static const OfxMemorySuiteV1 noMemory = {};
    const std::string_view suite = name;
    const bool isMissing = State().missingSuite == suite;
    if (host != HostProperties().Handle()) Complain("asks another host for a suite");
    if (version != 1 || (isMissing && !State().hasEmptySuite)) return nullptr;
    if (suite == kOfxPropertySuite) return isMissing ? &noProperties : &kHostProperties;
    if (suite == kOfxImageEffectSuite) return isMissing ? &noEffects : &kHostEffects;
    if (suite == kOfxParameterSuite) return isMissing ? &noParameters : &kHostParameters;
    if (suite == kOfxMemorySuite) return isMissing ? &noMemory : &kHostMemory;
    return nullptr;
}

OfxRectD RectangleIn(Arguments& arguments, const char* name) {
    PropertySet& set = arguments.Set();
    return {set.Number(name, 0), set.Number(name, 1), set.Number(name, 2), set.Number(name, 3)};
}

}  // namespace

OfxHost* TheOfxHost() {
    static OfxHost host = {HostProperties().Handle(), FetchSuite};
    return &host;
}

OpenfxModule::OpenfxModule(const std::string& path) {
    const std::filesystem::path file = FileOf(path);
    m_module = support::LoadModule(file.u16string().c_str());
    if (m_module == nullptr) Fail("the bundle cannot be loaded: " + file.string());
    m_count = Export<int (*)()>(m_module, "OfxGetNumberOfPlugins");
    m_get = Export<OfxPlugin* (*)(int)>(m_module, "OfxGetPlugin");
}

OpenfxModule::~OpenfxModule() {
    support::UnloadModule(m_module);
}

Arguments& Arguments::Add(const char* name, std::vector<PropertyValue> values) {
    const int count = static_cast<int>(values.size());
    m_set.Add(name, count, std::move(values));
    return *this;
}

OpenfxPlugin::OpenfxPlugin(const OpenfxModule& module, int index)
    : m_plugin(module.Get(index)), m_effect(*effects::kAllEffects.at(static_cast<std::size_t>(index))) {
    if (m_plugin == nullptr) Fail(Text("there is no plug-in %d", index));
    m_plugin->setHost(TheOfxHost());
    Expect(kOfxStatOK, kOfxActionLoad, nullptr);
    Expect(kOfxStatOK, kOfxActionDescribe, m_descriptor.Handle());
}

OpenfxPlugin::~OpenfxPlugin() {
    Call(kOfxActionUnload, nullptr);
}

OfxStatus OpenfxPlugin::Call(const char* action, const void* handle, Arguments* in, Arguments* out) const {
    return m_plugin->mainEntry(action, handle, in != nullptr ? in->Handle() : nullptr,
                               out != nullptr ? out->Handle() : nullptr);
}

void OpenfxPlugin::Expect(OfxStatus expected, const char* action, const void* handle, Arguments* in,
                          Arguments* out) const {
    const OfxStatus status = Call(action, handle, in, out);
    if (status != expected) Fail(Text("%s: %s gives %d, not %d", m_effect.name, action, status, expected));
}

std::unique_ptr<HostEffect> OpenfxPlugin::DescribedIn(const char* context) const {
    auto descriptor = std::make_unique<HostEffect>(false);
    Arguments in;
    in.Add(kOfxImageEffectPropContext, {std::string(context)});
    Expect(kOfxStatOK, kOfxImageEffectActionDescribeInContext, descriptor->Handle(), &in);
    return descriptor;
}

OpenfxInstance::OpenfxInstance(const OpenfxPlugin& plugin, const char* context, double frameRate)
    : m_plugin(plugin) {
    const std::unique_ptr<HostEffect> descriptor = plugin.DescribedIn(context);
    m_effect.properties.Put(kOfxImageEffectPropContext, {std::string(context)});
    m_effect.properties.Put(kOfxImageEffectPropFrameRate, {frameRate});
    m_effect.properties.Put(kOfxPropInstanceData, {static_cast<void*>(nullptr)});
    for (const auto& param : descriptor->params.params)
        m_effect.params.params.push_back(param->NewInstance());
    for (const auto& clip : descriptor->clips) {
        auto& own = *m_effect.clips.emplace_back(std::make_unique<HostClip>(clip->name));
        own.properties.Put(kOfxImageClipPropConnected, {clip->name == "Mask" ? 0 : 1});
        own.properties.Put(kOfxImageEffectPropFrameRate, {frameRate});
    }
    plugin.Expect(kOfxStatOK, kOfxActionCreateInstance, m_effect.Handle());
}

OpenfxInstance::~OpenfxInstance() {  // NOLINT(bugprone-exception-escape): complaining may, without memory
    if (m_plugin.Call(kOfxActionDestroyInstance, m_effect.Handle()) != kOfxStatOK) {
        Complain("an instance cannot be destroyed");
    }
    const auto& data = m_effect.properties.Values(kOfxPropInstanceData);
    void* const* const kept = data.size() == 1 ? std::get_if<void*>(data.data()) : nullptr;
    if (kept == nullptr || *kept != nullptr) Complain("an instance stays when it is destroyed");
}

HostParam& OpenfxInstance::Param(std::string_view name) const {
    HostParam* const param = m_effect.params.Find(name);
    if (param == nullptr) Fail("there is no parameter " + std::string(name));
    return *param;
}

HostClip& OpenfxInstance::Clip(std::string_view name) const {
    HostClip* const clip = m_effect.Find(name);
    if (clip == nullptr) Fail("there is no clip " + std::string(name));
    return *clip;
}

void OpenfxInstance::ShowMask(HostPicture* mask) const {
    Clip("Mask").Show(mask);
    Clip("Mask").properties.Put(kOfxImageClipPropConnected, {mask != nullptr ? 1 : 0});
}

OfxStatus OpenfxInstance::Change(const char* name, const char* reason) {
    Arguments in;
    in.Add(kOfxPropType, {std::string(kOfxTypeParameter)}).Add(kOfxPropName, {std::string(name)});
    in.Add(kOfxPropChangeReason, {std::string(reason)}).Add(kOfxPropTime, {0.0});
    in.Add(kOfxImageEffectPropRenderScale, {1.0, 1.0});
    return m_plugin.Call(kOfxActionInstanceChanged, m_effect.Handle(), &in);
}

void OpenfxInstance::ChoosePreset(std::uint32_t preset) {
    Param("preset").values[0] = preset + 1;
    const OfxStatus status = Change("preset", kOfxChangeUserEdited);
    if (status != kOfxStatOK) Fail(Text("choosing preset %u gives %d", preset, status));
}

OfxStatus OpenfxInstance::Render(double time, const OfxRectI& window, const char* field) {
    Arguments in;
    in.Add(kOfxPropTime, {time}).Add(kOfxImageEffectPropFieldToRender, {std::string(field)});
    in.Add(kOfxImageEffectPropRenderWindow, {window.x1, window.y1, window.x2, window.y2});
    in.Add(kOfxImageEffectPropRenderScale, {1.0, 1.0});
    return m_plugin.Call(kOfxImageEffectActionRender, m_effect.Handle(), &in);
}

void OpenfxInstance::RenderWhole(HostPicture& source, HostPicture& output, double time) {
    Clip(kOfxImageEffectSimpleSourceClipName).Show(&source);
    Clip(kOfxImageEffectOutputClipName).Show(&output);
    const OfxStatus status = Render(time, output.shape.bounds);
    if (status != kOfxStatOK) Fail(Text("rendering gives %d", status));
}

bool OpenfxInstance::IsIdentity(double time) {
    Arguments in, out;
    in.Add(kOfxPropTime, {time});
    out.Add(kOfxPropName, {std::string()}).Add(kOfxPropTime, {-1.0});
    const OfxStatus status = m_plugin.Call(kOfxImageEffectActionIsIdentity, m_effect.Handle(), &in, &out);
    if (status == kOfxStatReplyDefault) return false;
    Require(status == kOfxStatOK, "an invalid answer to whether the picture stays the same");
    Require(out.Set().Text(kOfxPropName) == kOfxImageEffectSimpleSourceClipName &&
                out.Set().Number(kOfxPropTime) == time,
            "a wrong picture instead of the source");
    return true;
}

OfxRectD OpenfxInstance::RegionOfDefinition(double time) {
    Arguments in, out;
    in.Add(kOfxPropTime, {time}).Add(kOfxImageEffectPropRenderScale, {1.0, 1.0});
    out.Add(kOfxImageEffectPropRegionOfDefinition, {0.0, 0.0, 0.0, 0.0});
    m_plugin.Expect(kOfxStatOK, kOfxImageEffectActionGetRegionOfDefinition, m_effect.Handle(), &in, &out);
    return RectangleIn(out, kOfxImageEffectPropRegionOfDefinition);
}

OfxRectD OpenfxInstance::RegionOfInterest(double time, const OfxRectD& part) {
    const std::string name = std::string(kOfxImageClipPropRoI_) + kOfxImageEffectSimpleSourceClipName;
    Arguments in, out;
    in.Add(kOfxPropTime, {time}).Add(kOfxImageEffectPropRenderScale, {1.0, 1.0});
    in.Add(kOfxImageEffectPropRegionOfInterest, {part.x1, part.y1, part.x2, part.y2});
    out.Add(name.c_str(), {part.x1, part.y1, part.x2, part.y2});
    const OfxStatus status =
        m_plugin.Call(kOfxImageEffectActionGetRegionsOfInterest, m_effect.Handle(), &in, &out);
    if (status == kOfxStatReplyDefault) return part;
    Require(status == kOfxStatOK, "does not say what a part needs");
    return RectangleIn(out, name.c_str());
}

void RequireNothingHeld() {
    RequireNoComplaints();
    if (State().images != 0) Fail(Text("%d images are not given back", State().images.exchange(0)));
    if (State().blocks != 0) Fail(Text("%d blocks of memory are not freed", State().blocks.exchange(0)));
}

namespace {

// Copies a picture from or to rows without padding, from the top. 8-bit pixels are the library's there.
template <bool kIsLoading>
void CopyRows(const HostPicture& picture, std::vector<std::uint8_t>& rows) {
    const OfxRectI bounds = picture.shape.bounds;
    const bool isByte = picture.shape.SampleBytes() == 1;
    const bool hasAlpha = picture.shape.Channels() == 4;
    const std::size_t pixelBytes = isByte ? 4 : static_cast<std::size_t>(picture.PixelBytes());
    if (kIsLoading)
        rows.resize(static_cast<std::size_t>(picture.shape.Width() * picture.shape.Height()) * pixelBytes);
    std::uint8_t* own = rows.data();
    for (int y = bounds.y2 - 1; y >= bounds.y1; --y) {
        for (int x = bounds.x1; x < bounds.x2; ++x, own += pixelBytes) {
            std::uint8_t* const pixel = picture.Pixel(x, y);
            if (!isByte) {
                std::memcpy(kIsLoading ? own : pixel, kIsLoading ? pixel : own, pixelBytes);
            } else if (kIsLoading) {
                own[0] = pixel[2], own[1] = pixel[1], own[2] = pixel[0], own[3] = hasAlpha ? pixel[3] : 255;
            } else {
                pixel[0] = own[2], pixel[1] = own[1], pixel[2] = own[0];
                if (hasAlpha) pixel[3] = own[3];
            }
        }
    }
}

}  // namespace

void RenderExpected(effects::EffectSession& session, double seconds, const HostPicture& source,
                    HostPicture& expected) {
    const int width = source.shape.Width(), height = source.shape.Height();
    std::vector<std::uint8_t> from;
    CopyRows<true>(source, from);
    std::vector<std::uint8_t> to(from.size());
    const auto step = static_cast<std::int32_t>(from.size()) / height;
    if (source.shape.SampleBytes() == 1) {
        Require(session.Render({from.data(), width, height, step, 0, 0, 0},
                               {to.data(), width, height, step, 0, 0, 0}, seconds),
                "the core does not render");
    } else {
        const render::DeepFormat format = {
            source.shape.SampleBytes() == 2 ? render::DeepSamples::kUnsigned16 : render::DeepSamples::kFloat,
            source.shape.Channels(), source.shape.isPremultiplied};
        Require(session.RenderDeep(
                    render::DeepFrame::Whole(width, height, format, {from.data(), step}, {to.data(), step}),
                    seconds),
                "the core does not render");
    }
    CopyRows<false>(expected, to);
}

void RenderExpected(const effects::EffectTable& effect, std::uint32_t preset, std::uint32_t seed,
                    double seconds, const HostPicture& source, HostPicture& expected) {
    const auto session = effects::EffectSession::Create(effect);
    session->ApplyPreset(preset);
    session->PinRandom(seed);
    RenderExpected(*session, seconds, source, expected);
}

bool IsOnlyInside(const HostPicture& picture, const HostPicture& whole, const OfxRectI& part,
                  std::uint8_t fill, int field) {
    const auto bytes = static_cast<std::size_t>(picture.PixelBytes());
    const OfxRectI& b = picture.shape.bounds;
    for (int y = b.y1; y < b.y2; ++y) {
        for (int x = b.x1; x < b.x2; ++x) {
            const bool isInside =
                x >= part.x1 && x < part.x2 && y >= part.y1 && y < part.y2 && (field < 0 || (y & 1) == field);
            const std::uint8_t* const pixel = picture.Pixel(x, y);
            if (isInside && !std::equal(pixel, pixel + bytes, whole.Pixel(x, y))) return false;
            if (!isInside && std::any_of(pixel, pixel + bytes, [fill](auto byte) { return byte != fill; }))
                return false;
        }
    }
    return true;
}

}  // namespace velmora::reelcheck

// The OpenFX bundle with one chosen fault that reelcheck must find. REELCHECK_FAULT names the fault. It stands between
// the host and the real entry points, which are compiled under other names, and changes what passes.

#include <array>
#include <atomic>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <stdexcept>
#include <string_view>
#include <thread>

#include "faces/openfx/ofx_api.h"

extern "C" {
OfxPlugin* RealOfxGetPlugin(int nth);
int RealOfxGetNumberOfPlugins();
}

namespace {

bool FaultIs(const char* name) {
    const char* const fault = std::getenv("REELCHECK_FAULT");
    return fault != nullptr && std::strcmp(fault, name) == 0;
}

OfxHost* g_real = nullptr;
OfxHost g_faulty = {};
OfxPropertySuiteV1 g_properties;
OfxImageEffectSuiteV1 g_effects;
OfxParameterSuiteV1 g_parameters;
OfxMemorySuiteV1 g_memory;
int g_images = 0;
OfxRectI g_bounds = {};
char* g_data = nullptr;  // of the image that was read last

template <typename Suite>
const Suite& Real(const char* name) {
    return *static_cast<const Suite*>(g_real->fetchSuite(g_real->host, name, 1));
}

OfxStatus KeepImage(OfxPropertySetHandle image) {
    if (++g_images % 5 == 0) return kOfxStatOK;
    return Real<OfxImageEffectSuiteV1>(kOfxImageEffectSuite).clipReleaseImage(image);
}
OfxStatus KeepMemory(void*) {
    return kOfxStatOK;
}
OfxStatus EditNothing(OfxParamSetHandle, const char*) {
    return kOfxStatOK;
}
int NeverStop(OfxImageEffectHandle) {
    return 0;
}
OfxStatus ReadPositive(OfxPropertySetHandle set, const char* name, int index, int* value) {
    const OfxStatus status = Real<OfxPropertySuiteV1>(kOfxPropertySuite).propGetInt(set, name, index, value);
    if (std::strcmp(name, kOfxImagePropRowBytes) == 0) *value = std::abs(*value);
    return status;
}
OfxStatus ReadFar(OfxPropertySetHandle set, const char* name, int index, int* value) {
    const bool isRowBytes = std::strcmp(name, kOfxImagePropRowBytes) == 0;
    return Real<OfxPropertySuiteV1>(kOfxPropertySuite).propGetInt(set, name, isRowBytes ? 7 : index, value);
}
OfxStatus ForgetHint(OfxPropertySetHandle set, const char* name, int index, const char* value) {
    if (std::strcmp(name, kOfxParamPropHint) == 0) return kOfxStatOK;
    return Real<OfxPropertySuiteV1>(kOfxPropertySuite).propSetString(set, name, index, value);
}
OfxStatus NoteData(OfxPropertySetHandle set, const char* name, int index, void** value) {
    const OfxPropertySuiteV1& real = Real<OfxPropertySuiteV1>(kOfxPropertySuite);
    const OfxStatus status = real.propGetPointer(set, name, index, value);
    if (status == kOfxStatOK && std::strcmp(name, kOfxImagePropData) == 0) {
        g_data = static_cast<char*>(*value);
        real.propGetIntN(set, kOfxImagePropBounds, 4, &g_bounds.x1);
    }
    return status;
}
OfxStatus HideText(OfxPropertySetHandle set, const char* name, int index, char** value) {
    const char* const hidden =
        FaultIs("ignores-fields") ? kOfxImageEffectPropFieldToRender : kOfxImageEffectPropPreMultiplication;
    if (std::strcmp(name, hidden) == 0) return kOfxStatErrUnknown;
    return Real<OfxPropertySuiteV1>(kOfxPropertySuite).propGetString(set, name, index, value);
}
OfxStatus HideMask(OfxPropertySetHandle set, const char* name, int index, int* value) {
    if (std::strcmp(name, kOfxImageClipPropConnected) == 0) return kOfxStatErrUnknown;
    return Real<OfxPropertySuiteV1>(kOfxPropertySuite).propGetInt(set, name, index, value);
}
OfxStatus WholePixels(OfxImageClipHandle clip, OfxTime time, OfxRectD* region) {
    const OfxStatus status =
        Real<OfxImageEffectSuiteV1>(kOfxImageEffectSuite).clipGetRegionOfDefinition(clip, time, region);
    region->x2 = region->x1 + 44.0;
    return status;
}
OfxStatus TakeSeedForStart(OfxParamSetHandle set, const char* name, OfxParamHandle* param,
                           OfxPropertySetHandle* properties) {
    if (std::strcmp(name, "startFrame") == 0) name = "seed";
    return Real<OfxParameterSuiteV1>(kOfxParameterSuite).paramGetHandle(set, name, param, properties);
}
OfxStatus NoKeys(OfxParamHandle, unsigned int* count) {
    *count = 0;
    return kOfxStatOK;
}

const void* FetchFaulty(OfxPropertySetHandle, const char* name, int version) {
    const std::string_view suite = name;
    const void* const real = g_real->fetchSuite(g_real->host, name, version);
    if (real == nullptr) {
        if (FaultIs("trusts-suites")) std::abort();
        return nullptr;
    }
    if (suite == kOfxPropertySuite) {
        g_properties = *static_cast<const OfxPropertySuiteV1*>(real);
        if (FaultIs("ignores-sign")) g_properties.propGetInt = ReadPositive;
        if (FaultIs("reads-far")) g_properties.propGetInt = ReadFar;
        if (FaultIs("forgets-hints")) g_properties.propSetString = ForgetHint;
        if (FaultIs("writes-beside")) g_properties.propGetPointer = NoteData;
        if (FaultIs("ignores-fields") || FaultIs("never-divides")) g_properties.propGetString = HideText;
        if (FaultIs("ignores-mask")) g_properties.propGetInt = HideMask;
        return &g_properties;
    }
    if (suite == kOfxImageEffectSuite) {
        g_effects = *static_cast<const OfxImageEffectSuiteV1*>(real);
        if (FaultIs("keeps-images")) g_effects.clipReleaseImage = KeepImage;
        if (FaultIs("never-stops")) g_effects.abort = NeverStop;
        if (FaultIs("counts-pixels")) g_effects.clipGetRegionOfDefinition = WholePixels;
        return &g_effects;
    }
    if (suite == kOfxParameterSuite) {
        g_parameters = *static_cast<const OfxParameterSuiteV1*>(real);
        if (FaultIs("many-steps")) g_parameters.paramEditBegin = EditNothing;
        if (FaultIs("ignores-start")) g_parameters.paramGetHandle = TakeSeedForStart;
        if (FaultIs("forgets-keys")) g_parameters.paramGetNumKeys = NoKeys;
        return &g_parameters;
    }
    g_memory = *static_cast<const OfxMemorySuiteV1*>(real);
    if (FaultIs("keeps-memory")) g_memory.memoryFree = KeepMemory;
    return &g_memory;
}

std::atomic<int> g_rendering{0};

OfxStatus Rendered(OfxStatus status) {
    if (status != kOfxStatOK || g_data == nullptr) return status;
    g_data[0] = static_cast<char>(g_data[0] ^ 1);  // a pixel that may be outside the window
    return status;
}

template <int kPlugin>
OfxStatus Main(const char* action, const void* handle, OfxPropertySetHandle in, OfxPropertySetHandle out) {
    const auto run = [&] { return RealOfxGetPlugin(kPlugin)->mainEntry(action, handle, in, out); };
    if (action == nullptr) return run();
    const std::string_view name = action;
    if (FaultIs("throws") && handle == nullptr && name == kOfxActionCreateInstance)
        throw std::logic_error("a fault");
    if (FaultIs("stays") && name == kOfxActionDestroyInstance) return kOfxStatOK;
    if (FaultIs("wants-tiles") && name == kOfxImageEffectActionGetRegionsOfInterest)
        return kOfxStatReplyDefault;
    if (FaultIs("never-neutral") && name == kOfxImageEffectActionIsIdentity) return kOfxStatReplyDefault;
    if (name != kOfxImageEffectActionRender) return run();
    if (FaultIs("shares-state")) {
        // Two frames at once: one gets what is the other's.
        ++g_rendering;
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
        const OfxStatus status = g_rendering > 1 ? kOfxStatFailed : run();
        --g_rendering;
        return status;
    }
    return Rendered(run());
}

template <int kPlugin>
void SetHost(OfxHost* host) {
    g_real = host;
    g_faulty = host != nullptr && host->fetchSuite != nullptr ? OfxHost{host->host, FetchFaulty} : OfxHost{};
    RealOfxGetPlugin(kPlugin)->setHost(host != nullptr ? &g_faulty : nullptr);
}

template <int kPlugin>
OfxPlugin* Faulty() {
    static OfxPlugin plugin = *RealOfxGetPlugin(kPlugin);
    plugin.setHost = SetHost<kPlugin>;
    plugin.mainEntry = Main<kPlugin>;
    return &plugin;
}

}  // namespace

#ifdef _WIN32
#define VELMORA_EXPORT __declspec(dllexport)
#else
#define VELMORA_EXPORT __attribute__((visibility("default")))
#endif

extern "C" {

VELMORA_EXPORT int OfxGetNumberOfPlugins() {
    return RealOfxGetNumberOfPlugins();
}

VELMORA_EXPORT OfxPlugin* OfxGetPlugin(int nth) {
    constexpr std::array kPlugins = {Faulty<0>, Faulty<1>, Faulty<2>, Faulty<3>, Faulty<4>};
    return nth >= 0 && nth < static_cast<int>(kPlugins.size()) ? kPlugins[static_cast<std::size_t>(nth)]()
                                                               : nullptr;
}

}  // extern "C"

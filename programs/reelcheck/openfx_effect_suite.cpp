// The image effect and memory suites of our OpenFX host.

#include <algorithm>
#include <cstdint>
#include <map>
#include <mutex>

#include "programs/reelcheck/check.h"
#include "programs/reelcheck/openfx_objects.h"

namespace velmora::reelcheck {
namespace {

OfxStatus GetPropertySet(OfxImageEffectHandle handle, OfxPropertySetHandle* properties) {
    auto* const effect = Handled::Of<HostEffect>(handle);
    if (effect == nullptr) return kOfxStatErrBadHandle;
    *properties = effect->properties.Handle();
    return kOfxStatOK;
}

OfxStatus GetParamSet(OfxImageEffectHandle handle, OfxParamSetHandle* params) {
    auto* const effect = Handled::Of<HostEffect>(handle);
    if (effect == nullptr) return kOfxStatErrBadHandle;
    *params = reinterpret_cast<OfxParamSetHandle>(&effect->params);
    return kOfxStatOK;
}

OfxStatus ClipDefine(OfxImageEffectHandle handle, const char* name, OfxPropertySetHandle* properties) {
    auto* const effect = Handled::Of<HostEffect>(handle);
    if (effect == nullptr) return kOfxStatErrBadHandle;
    if (effect->Find(name) != nullptr)
        return Complain(Text("defines the clip %s twice", name)), kOfxStatErrExists;
    auto& clip = *effect->clips.emplace_back(std::make_unique<HostClip>(name));
    *properties = clip.properties.Handle();
    return kOfxStatOK;
}

OfxStatus ClipGetHandle(OfxImageEffectHandle handle, const char* name, OfxImageClipHandle* out,
                        OfxPropertySetHandle* properties) {
    auto* const effect = Handled::Of<HostEffect>(handle);
    if (effect == nullptr) return kOfxStatErrBadHandle;
    HostClip* const clip = effect->Find(name);
    if (clip == nullptr) return Complain(Text("asks for the clip %s", name)), kOfxStatErrBadHandle;
    *out = reinterpret_cast<OfxImageClipHandle>(clip);
    if (properties != nullptr) *properties = clip->properties.Handle();
    return kOfxStatOK;
}

OfxStatus ClipGetPropertySet(OfxImageClipHandle handle, OfxPropertySetHandle* properties) {
    auto* const clip = Handled::Of<HostClip>(handle);
    if (clip == nullptr) return kOfxStatErrBadHandle;
    *properties = clip->properties.Handle();
    return kOfxStatOK;
}

OfxStatus ClipGetImage(OfxImageClipHandle handle, OfxTime time, const OfxRectD*,
                       OfxPropertySetHandle* image) {
    auto* const clip = Handled::Of<HostClip>(handle);
    if (clip == nullptr) return kOfxStatErrBadHandle;
    const HostPicture* const picture = clip->At(time);
    if (picture == nullptr) return kOfxStatFailed;
    const PictureShape& shape = picture->shape;
    const auto sides = [](const OfxRectI& r) { return std::vector<PropertyValue>{r.x1, r.y1, r.x2, r.y2}; };
    auto set = std::make_unique<PropertySet>(PropertySet::Of::kImage);
    set->Put(kOfxImageEffectPropPixelDepth, {std::string(shape.depth)});
    set->Put(kOfxImageEffectPropComponents, {std::string(shape.components)});
    set->Put(kOfxImageEffectPropPreMultiplication,
             {std::string(shape.isPremultiplied ? kOfxImagePreMultiplied : kOfxImageUnPreMultiplied)});
    set->Put(kOfxImagePropBounds, sides(shape.bounds));
    set->Put(kOfxImagePropRegionOfDefinition, sides(shape.Region()));
    set->Put(kOfxImagePropRowBytes, {picture->rowBytes});
    set->Put(kOfxImagePropData, {static_cast<void*>(picture->Pixel(shape.bounds.x1, shape.bounds.y1))});
    *image = set.release()->Handle();
    ++State().images;
    return kOfxStatOK;
}

OfxStatus ClipReleaseImage(OfxPropertySetHandle handle) {
    auto* const image = Handled::Of<PropertySet>(handle);
    if (image == nullptr) return kOfxStatErrBadHandle;
    delete image;
    --State().images;
    return kOfxStatOK;
}

OfxStatus ClipGetRegionOfDefinition(OfxImageClipHandle handle, OfxTime time, OfxRectD* bounds) {
    auto* const clip = Handled::Of<HostClip>(handle);
    if (clip == nullptr) return kOfxStatErrBadHandle;
    const HostPicture* const picture = clip->At(time);
    if (picture == nullptr) return kOfxStatFailed;
    const OfxRectI region = picture->shape.Region();
    const double width = State().canonicalWidth, height = State().canonicalHeight;
    *bounds = {region.x1 * width, region.y1 * height, region.x2 * width, region.y2 * height};
    return kOfxStatOK;
}

int Abort(OfxImageEffectHandle handle) {
    auto* const effect = Handled::Of<HostEffect>(handle);
    if (effect == nullptr) return 0;
    const int question = ++effect->questions;
    return effect->abortAt != 0 && question >= effect->abortAt ? 1 : 0;
}

struct Blocks {
    std::mutex mutex;
    std::map<void*, std::unique_ptr<GuardedMemory>> all;
};
Blocks& TheBlocks() {
    static Blocks blocks;
    return blocks;
}

// Blocks end at a forbidden page, so they are aligned only as their size is.
OfxStatus MemoryAlloc(void*, std::size_t bytes, void** out) {
    const int number = ++State().allocations;
    if (number == State().failingAllocation) return kOfxStatErrMemory;
    auto block = std::make_unique<GuardedMemory>(std::max<std::size_t>(bytes, 1), Edge::kBack);
    *out = block->Data();
    const std::scoped_lock lock(TheBlocks().mutex);
    TheBlocks().all[*out] = std::move(block);
    ++State().blocks;
    return kOfxStatOK;
}

OfxStatus MemoryFree(void* memory) {
    const std::scoped_lock lock(TheBlocks().mutex);
    if (TheBlocks().all.erase(memory) == 0)
        return Complain("frees memory that the host did not allocate"), kOfxStatErrBadHandle;
    --State().blocks;
    return kOfxStatOK;
}

}  // namespace

const OfxImageEffectSuiteV1 kHostEffects = {
    .getPropertySet = GetPropertySet,
    .getParamSet = GetParamSet,
    .clipDefine = ClipDefine,
    .clipGetHandle = ClipGetHandle,
    .clipGetPropertySet = ClipGetPropertySet,
    .clipGetImage = ClipGetImage,
    .clipReleaseImage = ClipReleaseImage,
    .clipGetRegionOfDefinition = ClipGetRegionOfDefinition,
    .abort = Abort,
    .imageMemoryAlloc = nullptr,
    .imageMemoryFree = nullptr,
    .imageMemoryLock = nullptr,
    .imageMemoryUnlock = nullptr,
};
const OfxMemorySuiteV1 kHostMemory = {MemoryAlloc, MemoryFree};

}  // namespace velmora::reelcheck

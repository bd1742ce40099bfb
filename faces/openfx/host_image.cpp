#include "faces/openfx/host_image.h"

#include <cstdlib>

namespace velmora::hosts::openfx {
namespace {

constexpr int kLargestSide = 1 << 20;

Depth DepthOf(std::string_view name) {
    if (name == kOfxBitDepthByte) return Depth::kByte;
    if (name == kOfxBitDepthShort) return Depth::kShort;
    if (name == kOfxBitDepthFloat) return Depth::kFloat;
    throw ActionFailed{kOfxStatErrImageFormat};
}

int ChannelsOf(std::string_view components) {
    if (components == kOfxImageComponentRGBA) return 4;
    if (components == kOfxImageComponentRGB) return 3;
    if (components == kOfxImageComponentAlpha) return 1;
    throw ActionFailed{kOfxStatErrImageFormat};
}

bool IsPossible(const OfxRectI& r) {
    const auto fits = [](int low, int high) {
        return low >= -kLargestSide && high <= kLargestSide && low < high;
    };
    return fits(r.x1, r.x2) && fits(r.y1, r.y2);
}

}  // namespace

HostImage::HostImage(const Suites& suites, OfxImageClipHandle clip, OfxTime time) : m_suites(suites) {
    const OfxStatus status = suites.effect->clipGetImage(clip, time, nullptr, &m_handle);
    if (status != kOfxStatOK) m_handle = nullptr;
    if (status == kOfxStatErrBadHandle || status == kOfxStatErrMemory) throw ActionFailed{status};
    if (status != kOfxStatOK && status != kOfxStatFailed) throw ActionFailed{kOfxStatFailed};
    if (m_handle == nullptr) return;
    try {
        Read(Properties(suites, m_handle));
        Check();
    } catch (...) {
        m_suites.effect->clipReleaseImage(m_handle);
        throw;
    }
}

HostImage::~HostImage() {
    if (m_handle != nullptr) m_suites.effect->clipReleaseImage(m_handle);
}

void HostImage::Read(const Properties& image) {
    const auto bounds = image.Rectangle(kOfxImagePropBounds);
    const auto rowBytes = image.Int(kOfxImagePropRowBytes);
    m_data = static_cast<std::byte*>(image.Pointer(kOfxImagePropData));
    if (!bounds || !rowBytes || m_data == nullptr) throw ActionFailed{kOfxStatErrImageFormat};
    m_bounds = *bounds;
    m_rowBytes = *rowBytes;
    m_depth = DepthOf(image.Text(kOfxImageEffectPropPixelDepth));
    m_channels = ChannelsOf(image.Text(kOfxImageEffectPropComponents));
    m_isPremultiplied =
        m_channels == 4 && image.Text(kOfxImageEffectPropPreMultiplication) == kOfxImagePreMultiplied;
    const auto region = image.Rectangle(kOfxImagePropRegionOfDefinition);
    m_region = region && IsPossible(*region) ? *region : m_bounds;
}

void HostImage::Check() const {
    if (!IsPossible(m_bounds)) throw ActionFailed{kOfxStatErrImageFormat};
    const int needed = (m_bounds.x2 - m_bounds.x1) * m_channels * SampleBytes(m_depth);
    if (m_bounds.y2 - m_bounds.y1 > 1 && std::abs(std::ptrdiff_t{m_rowBytes}) < needed)
        throw ActionFailed{kOfxStatErrImageFormat};
}

}  // namespace velmora::hosts::openfx

#include "render/wear.h"

#include "render/kernels.h"
#include "render/image.h"
#include "render/wear_factors.h"

namespace velmora::render {

std::uint32_t WearStripCount(const StageSettings& settings, std::int32_t width) noexcept {
    const std::int32_t stripWidth = WearPicture(settings.wearPattern).width;
    return static_cast<std::uint32_t>((std::int64_t{width} + stripWidth - 1) / stripWidth);
}

WearStage PrepareWear(const StageSettings& settings, std::int32_t width, Random& random, WearFactors& factors,
                      const Kernels& kernels) noexcept {
    // An unused orientation: the draw is part of the random sequence.
    random.Draw(0, 3);
    WearStage stage;
    stage.m_active = settings.wear != 0.0f;
    if (!stage.m_active) return stage;
    stage.m_picture = &WearPicture(settings.wearPattern);
    stage.m_channels = settings.wearChannels;
    stage.m_starts = random;
    const std::uint32_t strips = WearStripCount(settings, width);
    random.Skip(strips);
    stage.m_amount = settings.wear;
    const bool hasFactors =
        factors.Set(*stage.m_picture, stage.m_amount) && factors.SetStrips(stage.m_starts, strips, width);
    stage.m_factors = hasFactors ? &factors : nullptr;
    stage.m_kernels = &kernels;
    return stage;
}

void WearStage::ShadeUnder(std::uint8_t byte, Bgra& pixel) const noexcept {
    const Bgra shaded = ShadePixel(pixel, WearFraction(byte, m_amount));
    pixel = BlueOnly() ? Bgra{shaded.blue, pixel.green, pixel.red, pixel.alpha} : shaded;
}

void WearStage::Row(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept {
    if (m_factors != nullptr) {
        m_kernels->wear(in, out, width, m_factors->Over(y), BlueOnly() ? kBlueChannel : kColourChannels);
        if (!m_factors->HasOddBytes()) return;
    } else if (in != out) {
        std::copy(in, in + width, out);
    }
    // The kernel has left the pixels under odd bytes unchanged.
    ForEachByte(width, y, [&](std::int32_t x, std::uint8_t byte) {
        if (m_factors == nullptr || m_factors->IsOdd(byte)) ShadeUnder(byte, out[x]);
    });
}

}  // namespace velmora::render

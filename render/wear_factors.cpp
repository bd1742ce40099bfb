#include "render/wear_factors.h"

#include <algorithm>

namespace velmora::render {
namespace {

// Indexed by a channel's distance to white.
using Numbers = std::array<std::int16_t, 256>;

// What shading adds. Adding the largest float below a half rounds halves up in every single-precision product.
Numbers WantedBy(float fraction) noexcept {
    constexpr float kBelowHalf = 0x1.fffffep-2f;
    Numbers wanted;
    for (std::size_t distance = 0; distance < wanted.size(); ++distance) {
        const float product = fraction * static_cast<float>(static_cast<std::int32_t>(distance));
        wanted[distance] = static_cast<std::int16_t>(static_cast<std::int32_t>(product + kBelowHalf));
    }
    return wanted;
}

// The number to add after the multiplication: for each distance it must be at most 255 above what is missing.
std::optional<std::uint16_t> PlusFor(std::uint16_t times, const Numbers& wanted) noexcept {
    std::int16_t least = 32767, most = -32768;
    for (std::size_t distance = 0; distance < wanted.size(); ++distance) {
        const auto product =
            static_cast<std::uint16_t>((static_cast<std::uint32_t>(distance) << 8) * times >> 16);
        const auto missing = static_cast<std::int16_t>(wanted[distance] * 256 - product);
        least = std::min(least, missing);
        most = std::max(most, missing);
    }
    const std::int32_t plus = (most + least + 255) / 2;
    if (most - least > 255 || plus < 0) return std::nullopt;
    return static_cast<std::uint16_t>(plus);
}

}  // namespace

std::optional<WearFactor> WearFactorOf(float fraction) noexcept {
    if (!(fraction >= 0.0f && fraction <= 1.0f)) return std::nullopt;
    constexpr std::int32_t kFarthest = 8;
    const Numbers wanted = WantedBy(fraction);
    const auto nearest = static_cast<std::int32_t>(fraction * 65536.0f);
    for (std::int32_t step = 0; step <= 2 * kFarthest; ++step) {
        const std::int32_t times = nearest + (step % 2 == 0 ? -step / 2 : step / 2 + 1);
        if (times < 0 || times > 65535) continue;
        const auto factor = static_cast<std::uint16_t>(times);
        if (const auto plus = PlusFor(factor, wanted)) return WearFactor{factor, *plus};
    }
    return std::nullopt;
}

bool WearFactors::Set(const GreyPicture& picture, float amount) noexcept {
    if (m_picture == &picture && m_amount == amount) return true;
    m_picture = nullptr;
    if (picture.width < WearStrips::kPadding || picture.height > kMostPixels / picture.width) return false;
    m_picture = &picture;
    m_amount = amount;
    std::array<bool, 256> isUsed{};
    for (std::int32_t y = 0; y < picture.height; ++y) {
        const std::uint8_t* row = picture.pixels + y * picture.rowStep;
        for (std::int32_t x = 0; x < picture.width; ++x) isUsed[row[x]] = true;
    }
    std::array<WearFactor, 256> byByte{};
    m_isOdd.fill(false);
    m_hasOddBytes = false;
    for (std::size_t b = 0; b < byByte.size(); ++b) {
        if (!isUsed[b]) continue;
        const auto factor = WearFactorOf(WearFraction(static_cast<std::uint8_t>(b), amount));
        byByte[b] = factor.value_or(WearFactor{0, 0});
        m_isOdd[b] = !factor;
        m_hasOddBytes |= !factor;
    }
    WearFactor* next = m_factors.data() + WearStrips::kPadding;
    for (std::int32_t y = 0; y < picture.height; ++y) {
        const std::uint8_t* row = picture.pixels + y * picture.rowStep;
        next = std::transform(row, row + picture.width, next, [&](std::uint8_t b) { return byByte[b]; });
    }
    return true;
}

bool WearFactors::SetStrips(Random random, std::uint32_t count, std::int32_t frameWidth) noexcept {
    // Enough for the narrowest strips: no new memory when the pattern changes.
    const auto most = static_cast<std::uint64_t>(frameWidth / WearStrips::kPadding) + 1;
    std::uint16_t* const starts = m_starts.Reserve(most + 1);
    if (starts == nullptr) return false;
    WearRows rows(random, m_picture->height, 0);
    std::generate_n(starts, count, [&rows] { return static_cast<std::uint16_t>(rows.Next()); });
    starts[count] = 0;
    return true;
}

}  // namespace velmora::render

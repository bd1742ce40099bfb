#include "programs/common/frame_pool.h"

#include <algorithm>
#include <chrono>
#include <cstring>
#include <ctime>

namespace velmora::bench {
namespace {

void Paint(std::uint8_t* pixels, PictureSize size, std::uint32_t seed) {
    std::uint32_t noise = seed * 2654435761u + 1;
    for (std::int32_t y = 0; y < size.height; ++y) {
        for (std::int32_t x = 0; x < size.width; ++x, pixels += 4) {
            noise = noise * 1664525u + 1013904223u;
            const auto grain = static_cast<std::int32_t>(noise >> 27);
            pixels[0] = static_cast<std::uint8_t>(std::min(255, 200 * y / size.height + grain));
            pixels[1] = static_cast<std::uint8_t>(std::min(255, 220 * x / size.width + grain));
            pixels[2] = static_cast<std::uint8_t>((x / 64 + y / 64) % 4 == 0 ? 235 + grain / 2 : 60 + grain);
            pixels[3] = 255;
        }
    }
}

}  // namespace

FramePool::FramePool(PictureSize size) : m_size(size) {
    constexpr std::size_t kTotal = 130u << 20;
    const std::size_t pairs = std::max<std::size_t>(2, kTotal / (2 * Bytes()));
    for (std::size_t i = 0; i < pairs; ++i) {
        m_sources.emplace_back(Bytes());
        m_destinations.emplace_back(Bytes(), std::uint8_t{1});
        Paint(m_sources.back().data(), size, static_cast<std::uint32_t>(i));
    }
}

std::size_t FramePool::Bytes() const {
    return static_cast<std::size_t>(m_size.width) * static_cast<std::size_t>(m_size.height) * 4;
}

void FramePool::Copy() {
    std::memcpy(Destination(), Source(), Bytes());
}

double SecondsOfThisThread() {
#ifdef _WIN32
    return std::chrono::duration<double>(std::chrono::steady_clock::now().time_since_epoch()).count();
#else
    timespec time;
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
    return static_cast<double>(time.tv_sec) + 1e-9 * static_cast<double>(time.tv_nsec);
#endif
}

}  // namespace velmora::bench

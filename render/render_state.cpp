#include "render/render_state.h"

namespace velmora::render {
namespace {

// Spreads the bits of seed and number, so that neighbouring frames and seeds have nothing in common (an
// integer hash: two rounds of multiply and fold).
std::uint32_t Mix(std::uint32_t seed, std::uint32_t number) noexcept {
    std::uint64_t x = (std::uint64_t{seed} << 32 | number) + 0x9E3779B97F4A7C15u;
    x = (x ^ x >> 30) * 0xBF58476D1CE4E5B9u;
    x = (x ^ x >> 27) * 0x94D049BB133111EBu;
    return static_cast<std::uint32_t>(x ^ x >> 31);
}

}  // namespace

void FrameRandom::Seed(std::uint32_t state) noexcept {
    m_current = m_saved = Random(state);
    m_lastFrame = 0;
}

void FrameRandom::Pin(std::uint32_t seed, std::int32_t frameNumber) noexcept {
    m_current = m_saved = Random(Mix(seed, static_cast<std::uint32_t>(frameNumber)));
    m_lastFrame = frameNumber;
}

void FrameRandom::BeginFrame(std::int32_t frameNumber) noexcept {
    if (frameNumber == m_lastFrame) {
        m_current = m_saved;
    } else {
        m_saved = m_current;
    }
    m_lastFrame = frameNumber;
}

}  // namespace velmora::render

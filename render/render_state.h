// Everything in the renderer that outlives a frame. The caller owns it and passes it to every frame. Frames rendered
// at the same time need a state each.
#pragma once

#include <array>
#include <cstdint>
#include <memory>

#include "render/glow.h"
#include "render/random.h"
#include "render/growing_memory.h"
#include "render/scratches.h"
#include "render/wear_factors.h"

namespace velmora::render {

// Spreads the bits of seed and number, so that neighbouring frames and seeds have nothing in common (an
// integer hash: two rounds of multiply and fold).
inline std::uint32_t SeedOf(std::uint32_t seed, std::uint32_t number) noexcept {
    std::uint64_t x = (std::uint64_t{seed} << 32 | number) + 0x9E3779B97F4A7C15u;
    x = (x ^ x >> 30) * 0xBF58476D1CE4E5B9u;
    x = (x ^ x >> 27) * 0x94D049BB133111EBu;
    return static_cast<std::uint32_t>(x ^ x >> 31);
}

// The random sequence of jitter, wear and spots. A frame rendered twice in a row gets the same random numbers again;
// any other frame continues where the previous one left off.
class FrameRandom {
  public:
    // Starts the sequence. The first frame continues from here.
    void Seed(std::uint32_t state) noexcept {
        m_current = m_saved = Random(state);
        m_lastFrame = 0;
    }
    // Makes the next frame's random numbers depend only on `seed` and the frame number, not on earlier frames.
    void Pin(std::uint32_t seed, std::int32_t frameNumber) noexcept {
        m_current = m_saved = Random(SeedOf(seed, static_cast<std::uint32_t>(frameNumber)));
        m_lastFrame = frameNumber;
    }
    // Called once for each frame, before its first draw.
    void BeginFrame(std::int32_t frameNumber) noexcept {
        if (frameNumber == m_lastFrame) {
            m_current = m_saved;
        } else {
            m_saved = m_current;
        }
        m_lastFrame = frameNumber;
    }

    [[nodiscard]] Random& Numbers() noexcept { return m_current; }
    [[nodiscard]] const Random& Numbers() const noexcept { return m_current; }

  private:
    Random m_current;
    Random m_saved;
    std::int32_t m_lastFrame = 0;
};

// The contrast table and the value that it was built for.
struct ContrastCache {
    float contrast = -2.0f;  // outside the range, so the first contrast always builds the table
    std::array<std::uint8_t, 256> table{};
};

struct RenderState {
    FrameRandom random;
    ContrastCache contrast;
    ScratchMemory scratches;
    GlowMemory glow;
    WearFactors wear;
    GrowingMemory<Bgra> row;
};

}  // namespace velmora::render

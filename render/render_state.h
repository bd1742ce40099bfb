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

// The random sequence of jitter, wear and spots. A frame rendered twice in a row gets the same random numbers again;
// any other frame continues where the previous one left off.
class FrameRandom {
  public:
    // Starts the sequence. The first frame continues from here.
    void Seed(std::uint32_t state) noexcept;
    // Makes the next frame's random numbers depend only on `seed` and the frame number, not on earlier frames.
    void Pin(std::uint32_t seed, std::int32_t frameNumber) noexcept;
    // Called once for each frame, before its first draw.
    void BeginFrame(std::int32_t frameNumber) noexcept;

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

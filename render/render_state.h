// Everything of the renderer that outlives a frame. The caller owns it and passes it to every frame; frames
// that are rendered at the same time need a state each.
#pragma once

#include <array>
#include <cstdint>
#include <memory>

#include "render/glow.h"
#include "render/random.h"
#include "render/row_memory.h"
#include "render/scratches.h"
#include "render/wear_factors.h"

namespace velmora::render {

// The random sequence of jitter, wear and spots. A frame that is rendered twice in a row replays its random
// numbers; any other frame continues where the frame before left off.
class FrameRandom {
  public:
    // Starts the sequence. The first frame goes on from here.
    void Seed(std::uint32_t state) noexcept;
    // Makes the next frame's numbers a function of `seed` and the number alone, whatever was rendered before.
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
    float contrast = -2.0f;  // no setting: the first contrast always builds
    std::array<std::uint8_t, 256> table{};
};

struct RenderState {
    FrameRandom random;
    ContrastCache contrast;
    ScratchMemory scratches;
    GlowMemory glow;
    WearFactors wear;
    RowMemory row;
};

}  // namespace velmora::render

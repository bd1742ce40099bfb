// Scratches: lines that run down the film, dark where its surface is grazed and bright where the emulsion is gone.
// scratch_state.h computes their lives; this draws them.
//
// A scratch runs the whole height of the picture, tilted and wavering a little, and breaks off here and there.
// A black one never makes a channel brighter, a white one never darker; alpha is kept.
#pragma once

#include <array>
#include <cstdint>
#include <span>

#include "render/frame_context.h"
#include "render/image.h"
#include "render/scratch_line.h"
#include "render/scratch_span.h"
#include "render/scratch_state.h"
#include "render/stage_settings.h"

namespace velmora::render {

struct Kernels;

// What the stage keeps from frame to frame, and its working memory.
struct ScratchMemory {
    ScratchReplays replays;
    std::array<ScratchLine, kMostScratches> lines;
};

class ScratchStage {
  public:
    static constexpr bool kIsDamage = true;
    // They have a generator of their own.
    static std::uint32_t Draws(const StageSettings&, std::int32_t) noexcept { return 0; }
    ScratchStage() noexcept = default;
    ScratchStage(const ScratchLine* lines, std::uint32_t count, std::int32_t height,
                 const Kernels& kernels) noexcept;

    [[nodiscard]] bool IsActive() const noexcept { return m_count != 0; }
    [[nodiscard]] std::span<const ScratchLine> Lines() const noexcept { return {m_lines, m_count}; }
    // Where row `y` of the processed rectangle lies on the lines.
    [[nodiscard]] ScratchRowPlace PlaceOf(std::int32_t y) const noexcept;
    // Draws the scratches' part of row `y` of the processed rectangle; `in` may be `out`. Not for several threads at
    // once. Fastest from top to bottom.
    void Row(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept;

  private:
    void Find(std::int32_t y) const noexcept;

    const ScratchLine* m_lines = nullptr;
    std::uint32_t m_count = 0;
    std::uint64_t m_knotStep = 0;  // knots per row, 1/65536
    const Kernels* m_kernels = nullptr;
    // Of the rows drawn last.
    mutable ScratchRows m_rows;
    mutable std::array<ScratchSpans, kMostScratches> m_spans{};
};

// The scratches of a frame whose picture was moved sideways by `xOffset`. The stage points into `memory` and is valid
// until the memory is used again.
[[nodiscard]] ScratchStage PrepareScratches(const StageSettings& settings, std::int32_t xOffset,
                                            const FrameContext& context, ScratchMemory& memory,
                                            const Kernels& kernels) noexcept;

}  // namespace velmora::render

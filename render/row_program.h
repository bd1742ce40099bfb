// The steps for each row of a frame, made from the frame's plan: those of the active stages in the chain's order.
// Successive tables are joined into one, and tables that change nothing are left out.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "render/chain.h"
#include "render/kernels.h"

namespace velmora::render {

class RowProgram {
  public:
    // Keeps references into `plan`.
    RowProgram(const FramePlan& plan, const Kernels& kernels) noexcept;
    RowProgram(const RowProgram&) = delete;
    RowProgram& operator=(const RowProgram&) = delete;

    // True if rows are not changed.
    [[nodiscard]] bool IsEmpty() const noexcept { return m_count == 0 && m_glow == nullptr; }
    // Row `y`. The source pixels may be exactly where the result goes but must not overlap it otherwise.
    void Run(const ShiftedRow& in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept;
    // The same for a result that will not be read again soon. `scratch` holds one row, used if there is work.
    void Stream(const ShiftedRow& in, Bgra* scratch, Bgra* out, std::int32_t width,
                std::int32_t y) const noexcept;
    // After the last row that was streamed.
    void EndStream() const noexcept { m_kernels.endStream(); }

  private:
    // What a step needs from its input row.
    enum class Reads {
        kPixels,   // any part of the row, written to any place
        kRow,      // the whole row, each pixel at its own column
        kInPlace,  // the whole row, already in the output
    };
    struct Step {
        Reads reads;
        const void* stage;
        void (*run)(const RowProgram& program, const void* stage, const Bgra* in, Bgra* out,
                    std::int32_t width, std::int32_t y);
    };

    void Add(const JitterStage&) noexcept {}                        // rows come in shifted
    void Add(const GlowStage& stage) noexcept { m_glow = &stage; }  // always the first step
    void Add(const ColourStage&) noexcept { AddTone(); }
    void Add(const TintStage&) noexcept { AddTone(); }
    void Add(const WearStage& stage) noexcept { AddStage(stage, Reads::kRow); }
    void Add(const ScratchStage& stage) noexcept { AddStage(stage, Reads::kInPlace); }
    void Add(const SpotStage& stage) noexcept { AddStage(stage, Reads::kInPlace); }

    template <typename Stage>
    void AddStage(const Stage& stage, Reads reads) noexcept;
    void AddTone() noexcept;
    void PlanTone(const ColourStage& colour, const TintStage& tint) noexcept;
    template <typename Work>
    void FetchThrough(const ShiftedRow& in, Bgra* out, std::int32_t width, Work&& work) const noexcept;
    template <typename Work>
    void FetchParts(const ShiftedRow& in, Bgra* out, std::int32_t width, Work&& work) const noexcept;
    [[nodiscard]] bool TonesUnderGlow() const noexcept;
    std::size_t RunFirst(const ShiftedRow& in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept;
    void RunTone(const Bgra* in, Bgra* out, std::int32_t width) const noexcept;

    const Kernels& m_kernels;
    std::array<Step, kStageCount> m_steps{};  // a stage adds one at most
    std::size_t m_count = 0;
    const GlowStage* m_glow = nullptr;
    Tone m_tone;             // of colour and tint, which are neighbours
    bool m_hasTone = false;  // among the steps
    ChannelTables m_before;  // the mix
    ChannelTables m_after;   // the mix, or in its place
};

}  // namespace velmora::render

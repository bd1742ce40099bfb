// What happens to a row of a frame, made from the frame's plan: tables that follow each other are joined into
// one, tables that change nothing are left out, and the kernels are those of one form.
#pragma once

#include <cstdint>

#include "render/kernels.h"
#include "render/renderer.h"

namespace velmora::render {

class RowProgram {
  public:
    // Keeps references into `plan`.
    RowProgram(const FramePlan& plan, const Kernels& kernels) noexcept;
    RowProgram(const RowProgram&) = delete;
    RowProgram& operator=(const RowProgram&) = delete;

    // True when a row leaves as it came in.
    [[nodiscard]] bool IsEmpty() const noexcept;
    // Row `y`. The source pixels of the row may lie where they go to, but not overlap it otherwise.
    void Run(const ShiftedRow& in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept;
    // The same into a row that is not read again soon, by way of `room` for a row where there is work to do.
    void Stream(const ShiftedRow& in, Bgra* room, Bgra* out, std::int32_t width,
                std::int32_t y) const noexcept;
    // After the last row that was streamed.
    void EndStream() const noexcept { m_kernels.endStream(); }

  private:
    void PlanTables() noexcept;
    template <typename Step>
    void FetchThrough(const ShiftedRow& in, Bgra* out, std::int32_t width, Step&& step) const noexcept;
    void RunTone(const Bgra* in, Bgra* out, std::int32_t width) const noexcept;
    void Wear(const Bgra* in, Bgra* out, std::int32_t width, std::int32_t y) const noexcept;

    const FramePlan& m_plan;
    const Kernels& m_kernels;
    Tone m_tone;
    ChannelTables m_before;  // the mix
    ChannelTables m_after;   // the mix, or in its place
};

}  // namespace velmora::render

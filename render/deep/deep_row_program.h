// The steps for each row of a deep frame: those of the plan's active stages, in the chain's order. A row passes through
// in blocks that stay in the first-level cache.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "render/chain.h"
#include "render/deep/deep_renderer.h"
#include "render/deep/deep_glow.h"
#include "render/deep/deep_kernels.h"
#include "render/deep/deep_tone.h"
#include "render/scratch_span.h"

namespace velmora::render {

// The shaken source picture (render/jitter.h), in blocks.
class DeepSource final : public DeepBlockReader {
  public:
    DeepSource(const DeepFrame& frame, const DeepPicture& picture, const JitterStage& jitter,
               const DeepKernels& kernels) noexcept
        : m_frame(frame), m_picture(picture), m_jitter(jitter), m_kernels(kernels) {}

    void Read(std::int32_t y, std::int32_t from, std::int32_t count,
              DeepBlock& block) const noexcept override;
    void ReadSixteenths(std::int32_t y, std::int32_t from, std::int32_t count,
                        DeepBlock& block) const noexcept override;

  private:
    // The columns of a block that the source has, and the first of their pixels.
    struct Part {
        std::int32_t first, end;
        const std::uint8_t* pixels;
    };
    [[nodiscard]] Part PartOf(std::int32_t y, std::int32_t from, std::int32_t count) const noexcept;
    void SumPixels(std::int32_t y, std::int32_t from, std::int32_t count, DeepBlock& block,
                   std::int32_t at) const noexcept;

    const DeepFrame& m_frame;
    const DeepPicture& m_picture;
    const JitterStage& m_jitter;
    const DeepKernels& m_kernels;
};

class DeepRowProgram {
  public:
    // Keeps references into the arguments. `streams`: the results are too many to stay in the caches.
    DeepRowProgram(const DeepFrame& frame, const FramePlan& plan, DeepGlow& glow, const DeepKernels& kernels,
                   bool streams) noexcept;
    DeepRowProgram(const DeepRowProgram&) = delete;
    DeepRowProgram& operator=(const DeepRowProgram&) = delete;

    // Reads row `y` of the window from the source and writes it to the destination.
    void Run(const DeepSource& source, std::int32_t y) const noexcept;

  private:
    // A row on its way, and what its stages have found out about it.
    struct Row {
        std::int32_t y;
        std::int32_t from = 0;  // columns in the block
        std::int32_t count = 0;
        DeepBlock block;
        // The strip of the wear picture that the next block starts in.
        WearRows strips{Random(), 3, 0};
        const std::uint8_t* wear = nullptr;
        std::int32_t wearLeft = 0;
        std::uint8_t wearBytes[kDeepBlock + DeepBlock::kPad];
        std::array<ScratchSpan, kMostScratches> spans{};  // without weights if the row has no such scratch
    };
    struct Step {
        void (DeepRowProgram::*begin)(Row&) const noexcept;  // once for each row
        void (DeepRowProgram::*run)(Row&) const noexcept;    // for each block, from the left
    };

    void Add(const JitterStage&) noexcept {}  // rows come in shifted
    void Add(const GlowStage&) noexcept;
    void Add(const ColourStage&) noexcept { AddTone(); }
    void Add(const TintStage&) noexcept { AddTone(); }
    void Add(const WearStage& stage) noexcept;
    void Add(const ScratchStage& stage) noexcept;
    void Add(const SpotStage& stage) noexcept;
    void AddTone() noexcept;

    void BeginNothing(Row&) const noexcept {}
    void BeginGlow(Row& row) const noexcept { m_glow.BeginRow(m_frame.width, row.y); }
    void RunGlow(Row& row) const noexcept { m_glow.Screen(row.block, row.from, row.count); }
    void RunTone(Row& row) const noexcept { m_kernels.tone(row.block, row.count, m_tone); }
    void BeginWear(Row& row) const noexcept;
    void RunWear(Row& row) const noexcept;
    void BeginScratches(Row& row) const noexcept;
    void RunScratches(Row& row) const noexcept;
    void RunSpots(Row& row) const noexcept;

    const DeepFrame& m_frame;
    const FramePlan& m_plan;
    DeepGlow& m_glow;
    const DeepKernels& m_kernels;
    bool m_streams;
    DeepTone m_tone;  // of colour and tint, which are neighbours
    bool m_hasTone = false;
    std::array<Step, kStageCount> m_steps{};  // a stage adds one at most
    std::size_t m_count = 0;
};

}  // namespace velmora::render

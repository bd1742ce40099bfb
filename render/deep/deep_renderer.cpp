#include "render/deep/deep_renderer.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <limits>

#include "render/deep/deep_row_program.h"

namespace velmora::render {
namespace {

// The addresses that rows of the frame use in a picture.
struct Extent {
    std::uintptr_t first, end;
};
Extent ExtentOf(const DeepFrame& frame, const DeepPicture& picture) noexcept {
    const auto top = reinterpret_cast<std::uintptr_t>(picture.Row(0));
    const auto bottom = reinterpret_cast<std::uintptr_t>(picture.Row(frame.height - 1));
    const auto rowBytes = static_cast<std::uintptr_t>(frame.width * frame.format.PixelBytes());
    return {std::min(top, bottom), std::max(top, bottom) + rowBytes};
}

bool Overlap(const DeepFrame& frame) noexcept {
    const Extent source = ExtentOf(frame, frame.source), destination = ExtentOf(frame, frame.destination);
    return source.first < destination.end && destination.first < source.end;
}

// Rows can be processed in place, unless the picture is shifted over itself.
bool NeedsCopy(const DeepFrame& frame, const JitterStage& jitter) noexcept {
    if (!Overlap(frame)) return false;
    const bool sameRows =
        frame.source.pixels == frame.destination.pixels && frame.source.rowStep == frame.destination.rowStep;
    return jitter.IsActive() || !sameRows;
}

// The rows and columns of the source that the window's rows are made from.
Rectangle NeededBy(const DeepFrame& frame, bool readsAll) noexcept {
    if (readsAll) return {0, frame.height, 0, frame.width};
    return frame.window;
}

// Replaces the source with a copy.
bool Detach(const DeepFrame& frame, const Rectangle& part, GrowingMemory<std::uint8_t>& memory,
            DeepPicture& picture) noexcept {
    const auto pixelBytes = static_cast<std::size_t>(frame.format.PixelBytes());
    const std::size_t rowBytes = static_cast<std::size_t>(frame.width) * pixelBytes;
    const auto height = static_cast<std::size_t>(frame.height);
    std::uint8_t* const copy = memory.Reserve(std::uint64_t{rowBytes} * height);
    if (copy == nullptr) return false;
    const auto first = static_cast<std::size_t>(part.left) * pixelBytes;
    for (std::int32_t y = part.top; y < part.bottom; ++y) {
        std::memcpy(copy + rowBytes * static_cast<std::size_t>(y) + first, frame.source.Row(y) + first,
                    static_cast<std::size_t>(part.Width()) * pixelBytes);
    }
    picture = {copy, static_cast<std::ptrdiff_t>(rowBytes)};
    return true;
}

bool IsAligned(const DeepPicture& picture, std::ptrdiff_t sampleBytes) noexcept {
    return reinterpret_cast<std::uintptr_t>(picture.pixels) % static_cast<std::uintptr_t>(sampleBytes) == 0 &&
           picture.rowStep % sampleBytes == 0;
}

}  // namespace

bool DeepFrame::IsValid() const noexcept {
    if (width < 1 || height < 1 || (format.channels != 3 && format.channels != 4)) return false;
    const std::ptrdiff_t pixelBytes = format.PixelBytes();
    const auto isPicture = [&](const DeepPicture& picture) {
        const std::ptrdiff_t most = std::numeric_limits<std::ptrdiff_t>::max();
        if (picture.pixels == nullptr || picture.rowStep == std::numeric_limits<std::ptrdiff_t>::min())
            return false;
        const std::ptrdiff_t step = std::abs(picture.rowStep);
        return width <= most / pixelBytes && step >= width * pixelBytes && step <= most / height &&
               IsAligned(picture, pixelBytes / format.channels);
    };
    const Rectangle all = {0, height, 0, width};
    return isPicture(source) && isPicture(destination) && !window.IsEmpty() && window.Clipped(all) == window;
}

bool RenderDeep(const DeepFrame& frame, const FrameContext& context, const StageSettings& settings,
                RenderState& state, DeepMemory& memory, const RenderOptions& options) noexcept {
    const Kernels& kernels = KernelsOf(options.level);
    const DeepKernels& deepKernels = DeepKernelsOf(options.level);
    FramePlan plan = PlanFrame(context, settings, state, kernels);
    KeepWanted(plan, options);
    const bool glows = settings.glow > 0.0f && IsWanted(plan.glow, options);
    DeepPicture picture = frame.source;
    if (NeedsCopy(frame, plan.jitter) &&
        !Detach(frame, NeededBy(frame, glows || plan.jitter.IsActive()), memory.copy, picture)) {
        return false;
    }
    const DeepSource source(frame, picture, plan.jitter, deepKernels);
    DeepGlow glow;
    if (glows) {
        glow =
            PrepareDeepGlow(settings.glow, source, frame.width, frame.height, memory.glow, deepKernels.glow);
    }
    // Not when working in place: what was read is then still in the caches when it is written.
    const std::int64_t bytes = std::int64_t{frame.width} * frame.height * frame.format.PixelBytes();
    const bool streams = bytes >= options.streamedBytes && !Overlap(frame);
    const DeepRowProgram program(frame, plan, glow, deepKernels, streams);
    for (std::int32_t y = frame.window.top; y < frame.window.bottom; ++y) program.Run(source, y);
    if (streams) deepKernels.endStream();
    return true;
}

}  // namespace velmora::render

// The kernels with SSE2.

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <span>
#include <type_traits>

#include "render/glow_kernels.h"
#include "render/scratch_span.h"
#include "render/kernels.h"
#include "render/simd/target.h"
#include "render/ycbcr.h"

#if VM_HAS_SSE2
VM_BEGIN_TARGET("sse2")

namespace velmora::render {
namespace {

#include "render/simd/sse2.h"

#include "render/simd/rows.inc"
#include "render/simd/wear.inc"
#include "render/simd/tone_lines.inc"
#include "render/simd/table_words.inc"
#include "render/simd/mix.inc"
#include "render/simd/mix_words.inc"
#include "render/simd/tone_words.inc"
#include "render/simd/glow.inc"
#include "render/simd/ycbcr.inc"
#include "render/scratch_rows.inc"
#include "render/simd/scratch_span.inc"

}  // namespace

void DrawScratchesSse2(const ScratchLine* lines, std::uint32_t count, Bgra* row, std::int32_t width,
                       const ScratchRowPlace& place) noexcept {
    DrawLines(lines, count, row, width, place);
}

const Kernels kSse2Kernels = {ToneRow,   WearRow, DrawScratchesSse2, CopyRow, StreamRow,
                              EndStream, &kGlow,  &kYcbcr,           nullptr};

}  // namespace velmora::render

VM_END_TARGET
#endif

#include "tests/fuzz/fuzzed_frames.h"

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <new>

#if defined(__SANITIZE_ADDRESS__)
#define VM_POISONS 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define VM_POISONS 1
#endif
#endif
#if defined(VM_POISONS)
#include <sanitizer/asan_interface.h>
#endif

namespace velmora::fuzz {
namespace {

void Forbid([[maybe_unused]] const std::uint8_t* first, [[maybe_unused]] std::size_t count) {
#if defined(VM_POISONS)
    if (count != 0) __asan_poison_memory_region(first, count);
#endif
}
void Allow([[maybe_unused]] const std::uint8_t* first, [[maybe_unused]] std::size_t count) {
#if defined(VM_POISONS)
    if (count != 0) __asan_unpoison_memory_region(first, count);
#endif
}

constexpr std::int64_t kMostBytes = 1 << 20;
constexpr std::int64_t kMost = std::numeric_limits<std::int32_t>::max();

std::int64_t StepOf(const FrameRecord& frame) {
    return std::abs(std::int64_t{frame.rowStep});
}

// Mostly small: what matters at an edge matters there too, and takes less time.
std::int32_t ReadSide(FuzzInput& input, std::int32_t most) {
    const std::int32_t number = input.Byte();
    return 1 + number % (number < 192 ? 24 : most);
}

// A frame of a size that is quick to work on; where its first row lies is told later.
FrameRecord ReadFrame(FuzzInput& input, const PixelLayout& layout) {
    FrameRecord frame = {};
    frame.width = ReadSide(input, 130);
    frame.height = ReadSide(input, 48);
    const std::int32_t origins = input.Byte();
    frame.xOrigin = origins % 8;
    frame.yOrigin = origins / 8 % 8;
    const std::int32_t padding = input.Byte();
    frame.rowStep =
        static_cast<std::int32_t>(layout.rowBytes(std::int64_t{frame.xOrigin} + frame.width)) + padding / 2;
    if (padding % 2 != 0) frame.rowStep = -frame.rowStep;
    frame.reserved = 0xDEADBEEF;
    return frame;
}

// Replaces one number of a frame by any other.
void Spoil(FuzzInput& input, FrameRecord& frame) {
    static constexpr std::int32_t kEdges[] = {std::numeric_limits<std::int32_t>::min(),
                                              std::numeric_limits<std::int32_t>::min() + 1,
                                              -1,
                                              0,
                                              1,
                                              3,
                                              0x1FFFFFFF,
                                              0x20000000,
                                              0x3FFFFFFF,
                                              0x40000000,
                                              std::numeric_limits<std::int32_t>::max() - 1,
                                              std::numeric_limits<std::int32_t>::max()};
    std::int32_t* const numbers[] = {&frame.width, &frame.height, &frame.rowStep, &frame.xOrigin,
                                     &frame.yOrigin};
    std::int32_t& number = *numbers[input.Below(5)];
    const std::int32_t edge = input.Below(16);
    number = edge < 12 ? kEdges[edge] : static_cast<std::int32_t>(input.Word());
}

void Fill(FuzzInput& input, std::vector<std::uint8_t>& bytes) {
    const std::uint32_t seed = input.Byte();
    if (seed < 4) {
        std::fill(bytes.begin(), bytes.end(), static_cast<std::uint8_t>(seed * 85));
        return;
    }
    std::uint32_t state = seed;
    for (std::uint8_t& byte : bytes) {
        state = state * 1664525u + 1013904223u;
        byte = static_cast<std::uint8_t>(state >> 24);
    }
}

std::uint8_t* At(std::vector<std::uint8_t>& bytes, std::int64_t offset) {
    return bytes.data() + static_cast<std::ptrdiff_t>(offset);
}

}  // namespace

const PixelLayout kBgraLayout = {[](std::int64_t width) { return width * 4; },
                                 [](std::int64_t column) { return column * 4; }};
const PixelLayout kYcbcrLayout = {[](std::int64_t width) { return (width + 1) / 2 * 4; },
                                  [](std::int64_t column) { return column / 2 * 4; }};

bool IsFrame(const FrameRecord& frame, const PixelLayout& layout) {
    const std::int64_t width = std::int64_t{frame.xOrigin} + frame.width;
    const std::int64_t height = std::int64_t{frame.yOrigin} + frame.height;
    return frame.pixels != nullptr && frame.width >= 1 && frame.height >= 1 && frame.xOrigin >= 0 &&
           frame.yOrigin >= 0 && width <= kMost && height <= kMost && StepOf(frame) <= kMost &&
           layout.rowBytes(width) <= StepOf(frame);
}

FuzzedFrames::FuzzedFrames(FuzzInput& input, const PixelLayout& source, const PixelLayout& destination)
    : m_sourceLayout(source), m_destinationLayout(destination) {
    const std::int32_t kind = input.Below(8);
    m_source = ReadFrame(input, source);
    m_destination = kind == 1 ? m_source : ReadFrame(input, destination);
    if (kind == 1) {
        // In place, in the layout that needs more room.
        const std::int64_t width = std::int64_t{m_source.xOrigin} + m_source.width;
        const auto step =
            static_cast<std::int32_t>(std::max(source.rowBytes(width), destination.rowBytes(width)));
        m_source.rowStep = m_destination.rowStep = m_source.rowStep < 0 ? -step : step;
    }
    if (kind == 2) Spoil(input, m_source);
    if (kind == 3) Spoil(input, m_destination);
    static std::uint8_t somewhere = 0;
    m_source.pixels = m_destination.pixels = &somewhere;
    const bool areFrames = IsFrame(m_source, source) && IsFrame(m_destination, destination);
    const Shape sourceShape = areFrames ? ShapeOf(m_source, source) : Shape{};
    const Shape destinationShape = areFrames ? ShapeOf(m_destination, destination) : Shape{};
    m_areValid = areFrames && sourceShape.bytes <= kMostBytes && destinationShape.bytes <= kMostBytes;
    if (!m_areValid) {
        // Valid by its numbers, but more than can be lent: then it has no pixels.
        if (areFrames) m_destination.pixels = nullptr;
        return;
    }
    m_areTogether = kind == 1 || kind == 4;
    if (m_areTogether) {
        const std::int32_t offset = kind == 1 ? 0 : static_cast<std::int32_t>(input.Word()) % 4096;
        PlaceTogether(input, offset, sourceShape, destinationShape);
    } else {
        PlaceApart(input, sourceShape, destinationShape);
    }
    m_sourceBefore = m_sourceBytes;
    m_destinationBefore = m_destinationBytes;
}

FuzzedFrames::~FuzzedFrames() {
    Open();
}

FuzzedFrames::Shape FuzzedFrames::ShapeOf(const FrameRecord& frame, const PixelLayout& layout) const {
    // 31 bits times 31 bits.
    const std::int64_t rowsBefore = std::int64_t{frame.yOrigin} + frame.height - 1;
    Shape shape;
    shape.bytes = StepOf(frame) * rowsBefore + layout.rowBytes(std::int64_t{frame.xOrigin} + frame.width);
    if (frame.rowStep < 0) shape.pointer = StepOf(frame) * rowsBefore;
    return shape;
}

void FuzzedFrames::PlaceApart(FuzzInput& input, const Shape& source, const Shape& destination) {
    // Addresses need not be those of pixels either.
    const std::int32_t shift = input.Below(4);
    m_sourceBytes.resize(static_cast<std::size_t>(source.bytes + shift));
    m_destinationBytes.resize(static_cast<std::size_t>(destination.bytes + shift));
    m_source.pixels = At(m_sourceBytes, shift + source.pointer);
    m_destination.pixels = At(m_destinationBytes, shift + destination.pointer);
    Fill(input, m_sourceBytes);
    Fill(input, m_destinationBytes);
}

void FuzzedFrames::PlaceTogether(FuzzInput& input, std::int64_t offset, const Shape& source,
                                 const Shape& destination) {
    const std::int64_t sourceFirst = std::max<std::int64_t>(-offset, 0);
    const std::int64_t destinationFirst = std::max<std::int64_t>(offset, 0);
    m_destinationBytes.resize(
        static_cast<std::size_t>(std::max(sourceFirst + source.bytes, destinationFirst + destination.bytes)));
    m_source.pixels = At(m_destinationBytes, sourceFirst + source.pointer);
    m_destination.pixels = At(m_destinationBytes, destinationFirst + destination.pointer);
    Fill(input, m_destinationBytes);
}

std::int32_t FuzzedFrames::Width() const {
    return std::min(m_source.width, m_destination.width);
}
std::int32_t FuzzedFrames::Height() const {
    return std::min(m_source.height, m_destination.height);
}

FuzzedFrames::Copy FuzzedFrames::TakeCopy() {
    Copy copy;
    std::vector<std::uint8_t>& sourceHome = m_areTogether ? m_destinationBytes : m_sourceBytes;
    copy.sourceBytes = m_areTogether ? m_destinationBefore : m_sourceBefore;
    copy.destinationBytes = m_destinationBefore;
    copy.source = m_source;
    copy.destination = m_destination;
    const auto moved = [](const void* pixels, const std::vector<std::uint8_t>& from,
                          std::vector<std::uint8_t>& to) {
        return to.data() + (static_cast<const std::uint8_t*>(pixels) - from.data());
    };
    copy.source.pixels = moved(m_source.pixels, sourceHome, copy.sourceBytes);
    copy.destination.pixels = moved(m_destination.pixels, m_destinationBytes, copy.destinationBytes);
    return copy;
}

void FuzzedFrames::Release(const FrameRecord& frame, const PixelLayout& layout, std::int32_t width) const {
    const std::int64_t rows = std::int64_t{frame.yOrigin} + frame.height;
    const std::uint8_t* lowest = static_cast<const std::uint8_t*>(frame.pixels);
    if (frame.rowStep < 0) lowest -= StepOf(frame) * (rows - 1);
    for (std::int32_t y = 0; y < Height(); ++y) {
        Allow(lowest + StepOf(frame) * (frame.yOrigin + y) + layout.columnOffset(frame.xOrigin),
              static_cast<std::size_t>(layout.rowBytes(width)));
    }
}

void FuzzedFrames::Close(std::int32_t sourceWidth) {
    Forbid(m_sourceBytes.data(), m_sourceBytes.size());
    Forbid(m_destinationBytes.data(), m_destinationBytes.size());
    Release(m_source, m_sourceLayout, sourceWidth);
    Release(m_destination, m_destinationLayout, Width());
}

void FuzzedFrames::Open() {
    Allow(m_sourceBytes.data(), m_sourceBytes.size());
    Allow(m_destinationBytes.data(), m_destinationBytes.size());
}

bool FuzzedFrames::AreAs(const Copy& wanted) const {
    return m_destinationBytes == wanted.destinationBytes && m_sourceBytes == m_sourceBefore;
}

}  // namespace velmora::fuzz

#include "programs/reelfx/pipeline/frame_digests.h"

#include <algorithm>
#include <bit>
#include <cstring>
#include <utility>

#include "programs/common/digest.h"
#include "render/simd/target.h"

namespace velmora::hosts {
namespace {

constexpr std::size_t kBlock = 64;

// The whole part of 2^32 * |sin(i + 1)|.
constexpr std::uint32_t kSines[64] = {
    0xd76aa478, 0xe8c7b756, 0x242070db, 0xc1bdceee, 0xf57c0faf, 0x4787c62a, 0xa8304613, 0xfd469501,
    0x698098d8, 0x8b44f7af, 0xffff5bb1, 0x895cd7be, 0x6b901122, 0xfd987193, 0xa679438e, 0x49b40821,
    0xf61e2562, 0xc040b340, 0x265e5a51, 0xe9b6c7aa, 0xd62f105d, 0x02441453, 0xd8a1e681, 0xe7d3fbc8,
    0x21e1cde6, 0xc33707d6, 0xf4d50d87, 0x455a14ed, 0xa9e3e905, 0xfcefa3f8, 0x676f02d9, 0x8d2a4c8a,
    0xfffa3942, 0x8771f681, 0x6d9d6122, 0xfde5380c, 0xa4beea44, 0x4bdecfa9, 0xf6bb4b60, 0xbebfbc70,
    0x289b7ec6, 0xeaa127fa, 0xd4ef3085, 0x04881d05, 0xd9d4d039, 0xe6db99e5, 0x1fa27cf8, 0xc4ac5665,
    0xf4292244, 0x432aff97, 0xab9423a7, 0xfc93a039, 0x655b59c3, 0x8f0ccc92, 0xffeff47d, 0x85845dd1,
    0x6fa87e4f, 0xfe2ce6e0, 0xa3014314, 0x4e0811a1, 0xf7537e82, 0xbd3af235, 0x2ad7d2bb, 0xeb86d391,
};
constexpr int kTurns[4][4] = {{7, 12, 17, 22}, {5, 9, 14, 20}, {4, 11, 16, 23}, {6, 10, 15, 21}};

std::uint32_t WordAt(const std::uint8_t* bytes) {
    if constexpr (std::endian::native == std::endian::little) {
        std::uint32_t word;
        std::memcpy(&word, bytes, sizeof word);
        return word;
    }
    return std::uint32_t{bytes[0]} | std::uint32_t{bytes[1]} << 8 | std::uint32_t{bytes[2]} << 16 |
           std::uint32_t{bytes[3]} << 24;
}

// Adds what a round makes of its words. `b` is the word that the step before has just computed, so as little as
// possible is done after it: the bits of the second round's two halves do not meet, and adding joins them.
template <int kRound>
VM_ALWAYS_INLINE std::uint32_t Mixed(std::uint32_t sum, std::uint32_t b, std::uint32_t c, std::uint32_t d) {
    if constexpr (kRound == 0) return sum + (d ^ (b & (c ^ d)));
    if constexpr (kRound == 1) return sum + (c & ~d) + (b & d);
    if constexpr (kRound == 2) return sum + (b ^ (c ^ d));
    return sum + (c ^ (b | ~d));
}

using Words = std::array<std::uint32_t, 4>;
using State = std::array<Words, Md5Lanes::kLanes>;
using Blocks = std::array<const std::uint8_t*, Md5Lanes::kLanes>;
using Lanes = std::make_index_sequence<Md5Lanes::kLanes>;

// The words change places by their indices, which costs nothing.
template <std::size_t kStep>
VM_ALWAYS_INLINE void Step(Words& words, const std::uint8_t* block) {
    constexpr std::size_t kRound = kStep / 16, kFirst = (64 - kStep) % 4;
    constexpr std::size_t kFactor[4] = {1, 5, 3, 7}, kStart[4] = {0, 1, 5, 0};
    constexpr std::size_t kWord = (kFactor[kRound] * kStep + kStart[kRound]) % 16;
    const std::uint32_t b = words[(kFirst + 1) % 4], c = words[(kFirst + 2) % 4], d = words[(kFirst + 3) % 4];
    const std::uint32_t word = WordAt(block + 4 * kWord) + kSines[kStep];
    words[kFirst] = b + std::rotl(Mixed<kRound>(words[kFirst] + word, b, c, d), kTurns[kRound][kStep % 4]);
}

template <std::size_t kStep, std::size_t... kLane>
VM_ALWAYS_INLINE void StepOfEach(State& state, const Blocks& blocks,
                                 std::index_sequence<kLane...> /*lanes*/) {
    (Step<kStep>(state[kLane], blocks[kLane]), ...);
}

template <std::size_t... kStep>
VM_ALWAYS_INLINE void AddBlocks(State& state, const Blocks& blocks, std::index_sequence<kStep...> /*steps*/) {
    State next = state;
    (StepOfEach<kStep>(next, blocks, Lanes()), ...);
    for (std::size_t lane = 0; lane < Md5Lanes::kLanes; ++lane) {
        for (std::size_t i = 0; i < 4; ++i) state[lane][i] += next[lane][i];
    }
}

}  // namespace

void Md5Lanes::AddWhole(std::array<const std::uint8_t*, kLanes> bytes, std::size_t blocks) {
    State state = m_state;
    for (; blocks > 0; --blocks) {
        AddBlocks(state, bytes, std::make_index_sequence<64>());
        for (const std::uint8_t*& lane : bytes) lane += kBlock;
    }
    m_state = state;
}

void Md5Lanes::Add(const std::array<const std::uint8_t*, kLanes>& bytes, std::size_t size) {
    const std::size_t held = m_size % kBlock, taken = std::min(size, (kBlock - held) % kBlock);
    m_size += size;
    std::array<const std::uint8_t*, kLanes> rests = {}, next = bytes;
    for (std::size_t lane = 0; lane < kLanes; ++lane) {
        std::copy_n(bytes[lane], taken, m_rest[lane].begin() + static_cast<std::ptrdiff_t>(held));
        rests[lane] = m_rest[lane].data();
        next[lane] += taken;
    }
    if (held > 0 && held + taken == kBlock) AddWhole(rests, 1);
    if (held > 0 && held + taken < kBlock) return;
    const std::size_t whole = (size - taken) / kBlock;
    AddWhole(next, whole);
    for (std::size_t lane = 0; lane < kLanes; ++lane) {
        std::copy_n(next[lane] + whole * kBlock, (size - taken) % kBlock, m_rest[lane].begin());
    }
}

std::array<Md5Lanes::Sum, Md5Lanes::kLanes> Md5Lanes::Finish() {
    // A one bit, zeros, and the number of bits up to the end of a block.
    std::array<std::uint8_t, 2 * kBlock> end = {0x80};
    const std::size_t size = (m_size % kBlock < 56 ? kBlock : 2 * kBlock) - m_size % kBlock;
    for (std::size_t i = 0; i < 8; ++i) {
        end[size - 8 + i] = static_cast<std::uint8_t>(m_size * 8 >> (8 * i));
    }
    std::array<const std::uint8_t*, kLanes> ends;
    ends.fill(end.data());
    Add(ends, size);
    std::array<Sum, kLanes> sums;
    for (std::size_t lane = 0; lane < kLanes; ++lane) {
        for (std::size_t i = 0; i < 16; ++i) {
            sums[lane][i] = static_cast<std::uint8_t>(m_state[lane][i / 4] >> (8 * (i % 4)));
        }
    }
    return sums;
}

BgraPicture FrameDigests::Take(std::int32_t width, std::int32_t height, SampleType samples) {
    BgraPicture picture;
    {
        const std::lock_guard lock(m_mutex);
        if (!m_spare.empty()) {
            picture = std::move(m_spare.back());
            m_spare.pop_back();
        }
    }
    const bool isFit = picture.Width() == width && picture.Height() == height && picture.Samples() == samples;
    if (!isFit) picture = BgraPicture(width, height, samples);
    return picture;
}

void FrameDigests::GiveBack(BgraPicture& picture) {
    const std::lock_guard lock(m_mutex);
    m_spare.push_back(std::exchange(picture, BgraPicture()));
}

void FrameDigests::Compute(std::span<PipelineItem* const> items) {
    const BgraPicture& first = items[0]->picture;
    if (items.size() == 1) {  // faster than a single lane
        const auto width = static_cast<std::int32_t>(first.RowBytes() / 4);
        items[0]->digest = FrameDigest(first.Row(0), width, first.Height(), first.Stride());
    } else {
        Md5Lanes lanes;
        for (std::int32_t y = 0; y < first.Height(); ++y) {
            std::array<const std::uint8_t*, kBatch> rows;
            for (std::size_t i = 0; i < kBatch; ++i)
                rows[i] = items[i < items.size() ? i : 0]->picture.Row(y);
            lanes.Add(rows, first.RowBytes());
        }
        const auto sums = lanes.Finish();
        for (std::size_t i = 0; i < items.size(); ++i)
            items[i]->digest = HexOf(sums[i].data(), sums[i].size());
    }
    for (PipelineItem* const item : items) GiveBack(item->picture);
}

}  // namespace velmora::hosts

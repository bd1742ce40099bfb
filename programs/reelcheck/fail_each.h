// Makes every allocation of an operation fail once.
#pragma once

#include <algorithm>
#include <cstdint>

#include "programs/reelcheck/allocation_ledger.h"
#include "programs/reelcheck/check.h"

namespace velmora::reelcheck {

// What GetEffectsLibrary allocates for each library object and keeps until the process ends: a list and its 33
// entries.
inline constexpr std::uint64_t kBlocksOfSettings = 34;

// Runs twice, because the C++ runtime keeps some memory after its first use: the second run may leave at most `kept`
// blocks. Returns the result of `run`.
template <typename Run>
std::uint64_t RunTwice(Run&& run, std::uint64_t failing, std::uint64_t kept) {
    run(failing);
    const std::uint64_t before = LiveBlocks();
    const std::uint64_t count = run(failing);
    const std::uint64_t now = LiveBlocks();
    if (now > before + kept) {
        Fail(Text("%llu blocks are lost", static_cast<unsigned long long>(now - before - kept)));
    }
    return count;
}

// `run(failing)` does the work under an AllocationWatch(failing), checks the result and returns how many allocations
// it saw. It runs first without a failure, then once for each allocation: when there are more than `most`, for the
// first ones and a sample of the rest.
template <typename Run>
void FailEach(CheckContext& context, const char* what, std::uint64_t most, std::uint64_t kept, Run&& run) {
    SetPlace("%s, with all memory", what);
    const std::uint64_t count = RunTwice(run, 0, kept);
    const std::uint64_t stride = std::max<std::uint64_t>(1, count / std::max<std::uint64_t>(1, most / 2));
    for (std::uint64_t k = 1; k <= count;) {
        SetPlace("%s, allocation %llu of %llu fails", what, static_cast<unsigned long long>(k),
                 static_cast<unsigned long long>(count));
        RunTwice(run, k, kept);
        const bool takesAll = count <= most || k < most / 2;
        k += takesAll
                 ? 1
                 : static_cast<std::uint64_t>(context.dice.Between(1, static_cast<std::int32_t>(2 * stride)));
    }
    SetPlace("%s, with all memory again", what);
    run(0);
}

}  // namespace velmora::reelcheck

// A session for a case's effect with its settings.
#pragma once

#include <memory>

#include "programs/common/bench_cases.h"
#include "effects/effect_session.h"

namespace velmora::bench {

// Throws std::bad_alloc.
[[nodiscard]] std::unique_ptr<effects::EffectSession> SessionOf(const BenchCase& test);

}  // namespace velmora::bench

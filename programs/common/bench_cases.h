// What is measured: an effect with settings that make all of its stages work.
#pragma once

#include <cstdint>
#include <span>

namespace velmora::bench {

// One value that a case gives a parameter, in stored form: sliders normalised, flags 0 or 1, items and
// colours as they are.
struct CaseValue {
    std::uint32_t parameter;
    double value;
};

struct BenchCase {
    const char* name;
    std::uint32_t effect;               // as the library offers them
    std::span<const CaseValue> values;  // other parameters: "Reset To None"
    double goalNative;                  // x memcpy of a frame
    double goalDll;
};

[[nodiscard]] std::span<const BenchCase> BenchCases() noexcept;

}  // namespace velmora::bench

// What is measured: an effect with settings that make all of its stages work.
#pragma once

#include <cstdint>
#include <span>

namespace velmora::bench {

// The value of one parameter in a case, in stored form: sliders normalised, flags 0 or 1, items and colours
// as they are.
struct CaseValue {
    std::uint32_t parameter;
    double value;
};

struct BenchCase {
    const char* name;
    std::uint32_t effect;               // index in the library's order
    std::span<const CaseValue> values;  // other parameters: "Reset To None"
    double goalNative;                  // x memcpy of a frame
    double goalDll;
};

[[nodiscard]] std::span<const BenchCase> BenchCases() noexcept;

}  // namespace velmora::bench

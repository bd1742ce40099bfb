// What is measured: an effect with settings that make all of its stages work.
#pragma once

#include <cstdint>
#include <span>
#include <string>

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
    double goalNative;                  // with AVX2, as a ratio to a memcpy of a frame
    double goalDll;
    double goalBelow;  // the same with SSSE3, for both builds; 0: none
};

[[nodiscard]] std::span<const BenchCase> BenchCases() noexcept;
// The one of them that makes the most work.
[[nodiscard]] const BenchCase& EverythingCase() noexcept;
// The case's name with its goals.
[[nodiscard]] std::string TitleOf(const BenchCase& test, double goal);

}  // namespace velmora::bench

// What emscripten's C++ library lacks of C++20. The web build puts it in front of every source.
#pragma once

#include <cstddef>
#include <version>

#if !defined(__cpp_lib_bit_cast)
namespace std {
template <typename To, typename From>
[[nodiscard]] constexpr To bit_cast(const From& from) noexcept {
    static_assert(sizeof(To) == sizeof(From));
    return __builtin_bit_cast(To, from);
}
}  // namespace std
#endif

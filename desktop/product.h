// What the library says about itself.
#pragma once

namespace velmora::support {

inline constexpr char kProductText[] = "Velmora Reel Effects";
inline constexpr int kVersionMajor = VELMORA_VERSION_MAJOR;
inline constexpr int kVersionMinor = VELMORA_VERSION_MINOR;
#if defined(_WIN32)
inline constexpr wchar_t kWebPage[] = L"https://www.velmora.example/reel-effects";
#endif

}  // namespace velmora::support

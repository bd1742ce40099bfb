// Messages and timers of the main window. Windows only.
#pragma once

#include <windows.h>

namespace velmora::reelview {

// lParam: a std::function<void()> to run and delete.
inline constexpr UINT kMessageRun = WM_APP + 1;

inline constexpr UINT_PTR kTimerPlay = 1, kTimerIdle = 2, kTimerWatch = 3;
inline constexpr UINT kPlayMilliseconds = 10, kIdleMilliseconds = 350;

}  // namespace velmora::reelview

// Random use: mouse, keys, commands and all kinds of files, valid and broken. MONKEY_SECONDS sets the duration
// (default 5), MONKEY_SEED the sequence.

#include <windows.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <iostream>
#include <random>
#include <string>
#include <vector>

#include "driver.h"
#include "held.h"
#include "programs/reelview/panel/panel_window_win32.h"
#include "programs/reelview/view/transport_bar_win32.h"
#include "programs/reelview/window/commands.h"

namespace velmora::reelview::test {
namespace {

int Number(const char* name, int usual) {
    const char* const text = std::getenv(name);
    return text != nullptr ? std::atoi(text) : usual;
}

BOOL CALLBACK AddWindow(HWND window, LPARAM windows) {
    reinterpret_cast<std::vector<HWND>*>(windows)->push_back(window);
    return TRUE;
}

class Monkey {
  public:
    explicit Monkey(unsigned seed) : m_dice(seed), m_program(L'"' + Media(L"small.y4m") + L'"') {}

    [[nodiscard]] const Program& Home() const { return m_program; }

    void Act() {
        const std::vector<HWND> windows = Windows();
        const HWND window = windows[static_cast<std::size_t>(Roll(static_cast<int>(windows.size())))];
        RECT area = {};
        GetClientRect(window, &area);
        const POINT place = {Roll(area.right + 20) - 10, Roll(area.bottom + 20) - 10};
        const LPARAM at = MAKELPARAM(place.x, place.y);
        switch (Roll(9)) {
            case 0:
                Press(window, place.x, place.y);
                break;
            case 1:
                PostMessageW(window, WM_LBUTTONDBLCLK, MK_LBUTTON, at);
                break;
            case 2:
                PostMessageW(window, WM_LBUTTONDOWN, MK_LBUTTON, at);
                for (int i = Roll(8); i > 0; --i) {
                    PostMessageW(window, WM_MOUSEMOVE, MK_LBUTTON,
                                 MAKELPARAM(Roll(area.right + 1), Roll(area.bottom + 1)));
                }
                PostMessageW(window, WM_LBUTTONUP, 0, at);
                break;
            case 3:
                PostMessageW(window, WM_MOUSEWHEEL, MAKEWPARAM(0, static_cast<WORD>((Roll(7) - 3) * 120)),
                             at);
                break;
            case 4:
                PostMessageW(window, WM_KEYDOWN, static_cast<WPARAM>(VK_PRIOR + Roll(15)), 0);
                break;
            case 5:
                PostMessageW(window, WM_CHAR, static_cast<WPARAM>(32 + Roll(96)), 0);
                break;
            case 6:
                Order();
                break;
            case 7:
                Drop();
                break;
            default:
                SetWindowPos(m_program.Window(), nullptr, 0, 0, 300 + Roll(1200), 200 + Roll(900),
                             SWP_NOZORDER | SWP_NOMOVE | SWP_ASYNCWINDOWPOS);
                break;
        }
        if (m_program.Dialog(0.0) != nullptr) m_program.CloseDialogs();
    }

    // As at the start, so that what the program holds can be compared.
    void Rest() {
        WaitFor([&] { return m_program.Dialog(0.0) == nullptr || m_program.CloseDialogs().empty(); }, 5.0);
        ChooseEffect(0);
        m_program.Drop({Media(L"small.y4m")});
        WaitFor([&] { return m_program.Status().starts_with(L"Frame 1 / 12"); });
        WaitFor([] { return false; }, 2.0);  // the presets' pictures
    }

  private:
    void ChooseEffect(int effect) const {
        SendMessageW(m_program.Control(kControlEffect), CB_SETCURSEL, static_cast<WPARAM>(effect), 0);
        PostMessageW(m_program.Window(), WM_COMMAND, MAKEWPARAM(kControlEffect, CBN_SELCHANGE), 0);
    }

    int Roll(int sides) { return std::uniform_int_distribution<int>(0, std::max(sides - 1, 0))(m_dice); }

    std::vector<HWND> Windows() const {
        std::vector<HWND> windows = {m_program.Window()};
        EnumChildWindows(m_program.Window(), AddWindow, reinterpret_cast<LPARAM>(&windows));
        return windows;
    }

    // All commands but Exit, and Help, which opens another program.
    void Order() {
        if (Roll(3) == 0) {
            ChooseEffect(Roll(5));
            return;
        }
        const int command = kCommandOpen + Roll(kCommandLoop - kCommandOpen + 1);
        if (command != kCommandExit) m_program.Command(command);
    }

    void Drop() {
        static const wchar_t* const kFiles[] = {L"small.y4m",   L"picture.png", L"cut.png",    L"empty.png",
                                                L"plain.avi",   L"cut.avi",     L"text.mp4",   L"huge.y4m",
                                                L"missing.bmp", L"picture.jpg", L"header.y4m", L"picture.tif",
                                                L"seq01.png"};
        m_program.Drop({Media(kFiles[Roll(13)])});
    }

    std::mt19937 m_dice;
    Program m_program;
};

TEST(Monkey, FindsNothing) {
    const auto seed = static_cast<unsigned>(Number("MONKEY_SEED", 1));
    const int seconds = Number("MONKEY_SECONDS", 5);
    Monkey monkey(seed);
    const Program& program = monkey.Home();
    ASSERT_TRUE(WaitFor([&] { return program.Status().find(L"Frame") != std::wstring::npos; }));
    for (int i = 0; i < 200; ++i) monkey.Act();
    monkey.Rest();
    ASSERT_TRUE(program.Answers());
    const Held before = HeldBy(program.Process());
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(seconds);
    int acts = 0;
    for (; std::chrono::steady_clock::now() < end; ++acts) {
        monkey.Act();
        if (acts % 50 != 0) continue;
        ASSERT_TRUE(program.Lives() && program.Answers()) << "seed " << seed << ", act " << acts;
    }
    monkey.Rest();
    ASSERT_TRUE(program.Answers());
    const Held after = HeldBy(program.Process());
    std::cout << acts << " acts; handles " << before.handles << " to " << after.handles << ", GDI "
              << before.gdi << " to " << after.gdi << ", USER " << before.user << " to " << after.user
              << ", KiB " << before.bytes / 1024 << " to " << after.bytes / 1024 << '\n';
    EXPECT_LE(after.bytes, before.bytes + (SIZE_T{64} << 20));
    EXPECT_LE(after.handles, before.handles + 40);
    EXPECT_LE(after.gdi, before.gdi + 60);
    EXPECT_LE(after.user, before.user + 60);
}

}  // namespace
}  // namespace velmora::reelview::test

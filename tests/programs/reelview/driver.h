// reelview.exe in a process of its own, used through its windows as a person does.
#pragma once

#include <windows.h>

#include <functional>
#include <string>
#include <vector>

namespace velmora::reelview::test {

// True when the condition holds within a generous time.
bool WaitFor(const std::function<bool()>& condition, double seconds = 20.0);

std::wstring TextOf(HWND window);
// The folder that the test's files are in, and one of them.
std::wstring Media(const std::wstring& name = L"");

class Program {
  public:
    // Starts the program and waits for its window.
    explicit Program(const std::wstring& arguments);
    ~Program();
    Program(const Program&) = delete;
    Program& operator=(const Program&) = delete;

    [[nodiscard]] HWND Window() const { return m_window; }
    [[nodiscard]] HANDLE Process() const { return m_process.hProcess; }
    [[nodiscard]] bool Lives() const { return WaitForSingleObject(m_process.hProcess, 0) == WAIT_TIMEOUT; }
    // Its window answers.
    [[nodiscard]] bool Answers() const;
    [[nodiscard]] HWND Control(int id) const;
    [[nodiscard]] std::wstring Status() const;
    // A dialog or message box that it shows; null after the time.
    [[nodiscard]] HWND Dialog(double seconds = 10.0) const;
    void Command(int command) const { PostMessageW(m_window, WM_COMMAND, static_cast<WPARAM>(command), 0); }
    // Presses the default button of each dialog until there is none; their texts.
    std::wstring CloseDialogs() const;
    // Chooses a file in the dialog that a command opens.
    bool ChooseFile(int command, const std::wstring& file) const;
    // Closes the window; the exit code, or 999 when it does not end.
    DWORD Close();

  private:
    PROCESS_INFORMATION m_process = {};
    HWND m_window = nullptr;
};

// Mouse and keys as messages to a window; places in its pixels.
void Press(HWND window, int x, int y);
void Drag(HWND window, const std::vector<POINT>& way);
void Key(HWND window, WPARAM key);

}  // namespace velmora::reelview::test

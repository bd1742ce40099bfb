// Runs reelview.exe in a separate process and drives it through its windows like a user.
#pragma once

#include <windows.h>

#include <functional>
#include <string>
#include <vector>

namespace velmora::reelview::test {

// The clipboard's data in a format; empty if there is none.
std::vector<char> Clipboard(UINT format);

// True if the condition becomes true within a generous time limit.
bool WaitFor(const std::function<bool()>& condition, double seconds = 20.0);

std::wstring TextOf(HWND window);
// The folder with the test's files, and one of the files.
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
    // Whether its window responds.
    [[nodiscard]] bool Answers() const;
    [[nodiscard]] HWND Control(int id) const;
    [[nodiscard]] std::wstring Status() const;
    // A dialog or message box that the program shows; null after the time limit.
    [[nodiscard]] HWND Dialog(double seconds = 10.0) const;
    void Command(int command) const { PostMessageW(m_window, WM_COMMAND, static_cast<WPARAM>(command), 0); }
    // Presses the default button of each dialog until none is left, and returns their texts.
    std::wstring CloseDialogs() const;
    // Selects a file in the dialog that a command opens, and a file type by its number from 1; 0: the usual one.
    bool ChooseFile(int command, const std::wstring& file, int type = 0) const;
    void Drop(const std::vector<std::wstring>& files);
    // Closes the window and returns the exit code, or 999 when the program does not end.
    DWORD Close();

  private:
    PROCESS_INFORMATION m_process = {};
    HWND m_window = nullptr;
    char* m_drops = nullptr;  // in the program
    std::size_t m_dropCount = 0;
};

// Mouse and keyboard messages to a window; positions in its pixels.
void Press(HWND window, int x, int y);
void Drag(HWND window, const std::vector<POINT>& way);
void Key(HWND window, WPARAM key);

}  // namespace velmora::reelview::test

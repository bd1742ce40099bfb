// Answers the library's dialogs in place of a user.
//
// Either with stand-ins, where the library calls the system and this program answers at once, or in the system's own
// dialogs, which really appear and are cancelled (Windows only).
#pragma once

#include <string>

namespace velmora::reelcheck {

// Once per process, before the library is loaded.
void InstallDialogHooks();

// Stand-ins answer during its lifetime.
class DialogAnswers {
  public:
    // File dialogs are answered with this path (in the system's code page); null cancels them.
    explicit DialogAnswers(const char* path) noexcept;
    ~DialogAnswers();
    DialogAnswers(const DialogAnswers&) = delete;
    DialogAnswers& operator=(const DialogAnswers&) = delete;

    // How many times a file was requested, a message shown, another program started.
    [[nodiscard]] int FileDialogs() const noexcept;
    [[nodiscard]] int Messages() const noexcept;
    [[nodiscard]] int Programs() const noexcept;
};

// During its lifetime, every dialog of this thread that becomes active is cancelled.
class DialogCanceller {
  public:
    DialogCanceller() noexcept;
    ~DialogCanceller();  // NOLINT(performance-trivially-destructible): not trivial on Windows
    DialogCanceller(const DialogCanceller&) = delete;
    DialogCanceller& operator=(const DialogCanceller&) = delete;

    [[nodiscard]] int Cancelled() const noexcept;

  private:
    [[maybe_unused]] void* m_hook = nullptr;  // null where dialogs are linked in
};

}  // namespace velmora::reelcheck

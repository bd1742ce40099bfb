// Answers the dialogs that the library shows, in place of a user.
//
// By stand-ins: the library asks the system, and this program answers at once. Or in the system's own dialogs, which
// then really appear and are cancelled (Windows only).
#pragma once

#include <string>

namespace velmora::reelcheck {

// Once in a process, before the library is loaded.
void InstallDialogHooks();

// While it lives, stand-ins answer.
class DialogAnswers {
  public:
    // File dialogs are answered with this path (in the system's code page); null: cancelled.
    explicit DialogAnswers(const char* path) noexcept;
    ~DialogAnswers();
    DialogAnswers(const DialogAnswers&) = delete;
    DialogAnswers& operator=(const DialogAnswers&) = delete;

    // How often a file was asked for, a message shown, another program started.
    [[nodiscard]] int FileDialogs() const noexcept;
    [[nodiscard]] int Messages() const noexcept;
    [[nodiscard]] int Programs() const noexcept;
};

// While it lives, every dialog of this thread that becomes active is cancelled.
class DialogCanceller {
  public:
    DialogCanceller() noexcept;
    ~DialogCanceller();  // NOLINT(performance-trivially-destructible): on Windows it has something to do
    DialogCanceller(const DialogCanceller&) = delete;
    DialogCanceller& operator=(const DialogCanceller&) = delete;

    [[nodiscard]] int Cancelled() const noexcept;

  private:
    [[maybe_unused]] void* m_hook;  // null where dialogs are linked in
};

// A folder for this process's files; removed with all that is in it.
class WorkFolder {
  public:
    WorkFolder();
    ~WorkFolder();
    WorkFolder(const WorkFolder&) = delete;
    WorkFolder& operator=(const WorkFolder&) = delete;

    [[nodiscard]] std::string PathOf(const char* name) const { return m_folder + "/" + name; }

  private:
    std::string m_folder;
};

}  // namespace velmora::reelcheck

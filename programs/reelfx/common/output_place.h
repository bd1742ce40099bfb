// Where a result is written. Files come into being in a hidden folder beside their final place and move there
// when they are whole: a command that fails leaves nothing behind, and what was there before stays. The folder of a
// command that was killed (".reelfx-" and six letters) goes with the next one that writes beside it.
#pragma once

#include <cstdint>
#include <filesystem>
#include <string>

namespace velmora::hosts {

// Throws what the constructor of OutputPlace would, as far as it shows without writing.
void CheckOutputPlace(const std::string& path, bool mayOverwrite, std::int64_t firstImage = 1);

class OutputPlace {
  public:
    // `path` is a file's name, a pattern of image files ("frames-%04d.png"), or "-" for standard output.
    // `firstImage` is the number of a pattern's first image. Throws Failure: the file exists and may not be overwritten (kExitOutput), its folder cannot be written
    // to, or standard output is a terminal.
    OutputPlace(const std::string& path, bool mayOverwrite, std::int64_t firstImage = 1);
    ~OutputPlace();  // discards what was not kept
    OutputPlace(const OutputPlace&) = delete;
    OutputPlace& operator=(const OutputPlace&) = delete;

    // What to open for writing: a path, or "pipe:1".
    [[nodiscard]] std::string Address() const;
    // True for "-" and for devices and pipes in the file system, which are written to directly.
    [[nodiscard]] bool IsDirect() const { return m_folder.empty(); }
    // A file stood at the place when the command began.
    [[nodiscard]] bool ReplacesFile() const { return m_replaces; }
    // As the user named it, for messages.
    [[nodiscard]] const std::string& Name() const { return m_name; }

    // Moves everything written to its place.
    void Keep();

  private:
    std::filesystem::path m_path;
    std::filesystem::path m_folder;  // hidden, beside the final place; empty when written directly
    int m_lock = -1;                 // on the folder, so that others see that it is in use; -1: none
    std::string m_name;
    bool m_mayOverwrite;
    bool m_replaces = false;
};

}  // namespace velmora::hosts

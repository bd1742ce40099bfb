// Where a result is written. Files are written in a hidden folder beside their destination and moved when
// they are complete: a command that fails leaves nothing behind, and an older file stays. The folder of a
// killed command (".reelfx-" and six letters) is removed by the next command that writes beside it.
#pragma once

#include <cstdint>
#include <filesystem>
#include <string>

namespace velmora::hosts {

// Throws what the constructor of OutputPlace would throw, as far as can be known without writing.
void CheckOutputPlace(const std::string& path, bool mayOverwrite, std::int64_t firstImage = 1);

// "file:a.mp4" names a.mp4, as for FFmpeg; every other path stands for itself.
std::string LocalPath(const std::string& path);

// Throws Failure (kExitUsage) if writing to `path` would replace `input`, also under another name or through a link.
// Both may be patterns of image files.
void CheckIsNotInput(const std::string& path, const std::string& input, std::int64_t firstImage = 1);

// A folder for results. It is created if needed, and removed again if nothing was written to it.
class MadeFolder {
  public:
    // An empty path is the current folder. Throws Failure (kExitOutput) if the folder cannot be created.
    explicit MadeFolder(std::filesystem::path folder);
    ~MadeFolder();
    MadeFolder(const MadeFolder&) = delete;
    MadeFolder& operator=(const MadeFolder&) = delete;

  private:
    std::filesystem::path m_made;  // empty if it was there
};

class OutputPlace {
  public:
    // `path` is a file's name, a pattern of image files ("frames-%04d.png"), or "-" for standard output.
    // `firstImage` is the number of a pattern's first image. Throws Failure (kExitOutput) if the file exists
    // and may not be overwritten, its folder cannot be written to, or standard output is a terminal.
    OutputPlace(const std::string& path, bool mayOverwrite, std::int64_t firstImage = 1);
    ~OutputPlace();  // discards what Keep has not moved
    OutputPlace(const OutputPlace&) = delete;
    OutputPlace& operator=(const OutputPlace&) = delete;

    // What to open for writing: a path, or "pipe:1".
    [[nodiscard]] std::string Address() const;
    // True for "-" and for devices and pipes in the file system, which are written to directly.
    [[nodiscard]] bool IsDirect() const { return m_folder.empty(); }
    // True if there was a file at the destination when the command began.
    [[nodiscard]] bool ReplacesFile() const { return m_replaces; }
    // The user's name for it, for messages.
    [[nodiscard]] const std::string& Name() const { return m_name; }

    // Moves everything written to its destination.
    void Keep();

  private:
    std::filesystem::path m_path;
    std::filesystem::path m_folder;  // hidden, beside the destination; empty when written directly
    int m_lock = -1;                 // on the folder, so that others see that it is in use; -1: none
    std::string m_name;
    bool m_mayOverwrite;
    bool m_replaces = false;
};

}  // namespace velmora::hosts

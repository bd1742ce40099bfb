#include "programs/reelfx/common/output_place.h"

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <limits>
#include <string_view>
#include <utility>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include "programs/reelfx/common/failure.h"

extern "C" {
#include <libavformat/avformat.h>
}

namespace velmora::hosts {
namespace {

namespace fs = std::filesystem;

std::string ExistsText(const std::string& name) {
    return name + ": already exists; use --overwrite to replace it";
}

// True if the first file of a pattern exists, counting from either usual start, or the path itself.
bool SomethingStandsAt(const std::string& path, std::int64_t firstImage) {
    std::error_code ignored;
    char name[4096];
    for (const std::int64_t number : {firstImage == 1 ? 0 : firstImage, firstImage}) {
        if (av_get_frame_filename(name, sizeof name, path.c_str(), static_cast<int>(number)) < 0) break;
        if (fs::exists(name, ignored)) return true;
    }
    return fs::exists(path, ignored);
}

// The file that stands for a path: of a pattern, the first one with a number from `first` to `last`.
fs::path FileOf(const std::string& path, std::int64_t first, std::int64_t last) {
    std::error_code ignored;
    char name[4096];
    last = std::min<std::int64_t>(last, std::numeric_limits<int>::max());  // greater numbers have no names
    for (std::int64_t number = first; number <= last; ++number) {
        if (av_get_frame_filename(name, sizeof name, path.c_str(), static_cast<int>(number)) < 0) break;
        if (fs::exists(name, ignored)) return name;
    }
    return path;
}

// What a symbolic link points to in the end, also if that does not exist; another path itself.
fs::path TargetOf(fs::path path) {
    constexpr int kMostLinks = 40;  // as the system counts
    std::error_code error;
    for (int i = 0; i < kMostLinks && fs::is_symlink(path, error); ++i)
        path = path.parent_path() / fs::read_symlink(path, error);
    return path;
}

constexpr std::int64_t kLastStart = 4;  // where the numbers of a sequence may begin at most

constexpr char kHiddenFolder[] = ".reelfx-XXXXXX";
constexpr std::size_t kPrefixLength = sizeof kHiddenFolder - 1 - 6;

// Locks a folder of this user and returns a handle that holds the lock until it is closed or the process
// ends; -1 with `isTaken` if another process has the lock.
int LockFolder(const fs::path& folder, bool& isTaken) {
    isTaken = false;
    const int handle = open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC);
    struct stat status {};
    if (handle >= 0 && fstat(handle, &status) == 0 && status.st_uid == geteuid()) {
        if (flock(handle, LOCK_EX | LOCK_NB) == 0) return handle;
        isTaken = errno == EWOULDBLOCK;
    }
    if (handle >= 0) close(handle);
    return -1;
}

// Removes what killed commands left behind: hidden folders that nobody has locked.
void RemoveLeftOvers(const fs::path& beside) {
    std::error_code ignored;
    for (fs::directory_iterator entry(beside, ignored), end; !ignored && entry != end;
         entry.increment(ignored)) {
        const std::string name = entry->path().filename().string();
        if (name.size() != sizeof kHiddenFolder - 1 ||
            !name.starts_with(std::string(kHiddenFolder, kPrefixLength)))
            continue;
        bool isTaken = false;
        const int lock = LockFolder(entry->path(), isTaken);
        if (lock < 0) continue;
        std::error_code kept;
        fs::remove_all(entry->path(), kept);
        close(lock);
    }
}

// Makes and locks a folder. Another command may remove it as a leftover before it is locked; then it makes
// another one.
fs::path MakeHiddenFolder(const fs::path& beside, const std::string& name, int& lock) {
    for (;;) {
        std::string path = (beside / kHiddenFolder).string();
        if (!mkdtemp(path.data())) {
            throw Failure(kExitOutput, name + ": cannot be written: " + std::strerror(errno));
        }
        bool isTaken = false;
        lock = LockFolder(path, isTaken);
        struct stat status {};
        if (!isTaken && stat(path.c_str(), &status) == 0) return path;
        if (lock >= 0) close(lock);
    }
}

}  // namespace

std::string LocalPath(const std::string& path) {
    constexpr std::string_view kProtocol = "file:";
    return path.starts_with(kProtocol) ? path.substr(kProtocol.size()) : path;
}

void CheckIsNotInput(const std::string& path, const std::string& input, std::int64_t firstImage) {
    std::error_code ignored;
    const fs::path out(path), in(input);
    const bool isSamePattern =
        out.filename() == in.filename() &&
        fs::equivalent(fs::absolute(out).parent_path(), fs::absolute(in).parent_path(), ignored);
    const fs::path file = FileOf(path, firstImage, firstImage);
    const bool isSameFile =
        fs::is_regular_file(file, ignored) && fs::equivalent(file, FileOf(input, 0, kLastStart), ignored);
    if (path == "-" || (!isSamePattern && !isSameFile)) return;
    throw Failure(kExitUsage,
                  path + ": is the input, which would be lost; choose another name for the output");
}

void CheckOutputPlace(const std::string& path, bool mayOverwrite, std::int64_t firstImage) {
    if (path == "-") {
        if (isatty(STDOUT_FILENO) == 0) return;
        throw Failure(kExitOutput,
                      "standard output is a terminal; pipe it into a program or give a file name");
    }
    std::error_code ignored;
    const fs::file_status status = fs::status(path, ignored);
    if (fs::is_directory(status)) throw Failure(kExitOutput, path + ": is a folder");
    if (fs::exists(status) && !fs::is_regular_file(status)) return;
    if (!mayOverwrite && SomethingStandsAt(path, firstImage)) throw Failure(kExitOutput, ExistsText(path));
    if (access(fs::absolute(path).parent_path().c_str(), W_OK | X_OK) != 0) {
        throw Failure(kExitOutput, path + ": cannot be written: " + std::strerror(errno));
    }
}

MadeFolder::MadeFolder(fs::path folder) {
    std::error_code error;
    if (folder.empty() || fs::is_directory(folder, error)) return;
    if (!fs::create_directory(folder, error)) {
        throw Failure(kExitOutput, folder.string() + ": the folder cannot be created: " + error.message());
    }
    m_made = std::move(folder);
}

MadeFolder::~MadeFolder() {
    std::error_code isNotEmpty;
    if (!m_made.empty()) fs::remove(m_made, isNotEmpty);
}

OutputPlace::OutputPlace(const std::string& path, bool mayOverwrite, std::int64_t firstImage)
    : m_path(path), m_name(path == "-" ? "standard output" : path), m_mayOverwrite(mayOverwrite) {
    CheckOutputPlace(path, mayOverwrite, firstImage);
    std::error_code ignored;
    const fs::file_status status = fs::status(m_path, ignored);
    if (path == "-" || (fs::exists(status) && !fs::is_regular_file(status))) return;
    m_replaces = SomethingStandsAt(path, firstImage);
    // Absolute, because a relative name with a colon could be taken for an address.
    m_path = fs::absolute(m_path);
    // A symbolic link is kept; its target is replaced, or made.
    m_path = TargetOf(m_path);
    RemoveLeftOvers(m_path.parent_path());
    m_folder = MakeHiddenFolder(m_path.parent_path(), m_name, m_lock);
}

OutputPlace::~OutputPlace() {
    std::error_code ignored;
    if (!m_folder.empty()) fs::remove_all(m_folder, ignored);
    if (m_lock >= 0) close(m_lock);
}

std::string OutputPlace::Address() const {
    if (m_path == "-") return "pipe:1";
    return (m_folder.empty() ? m_path : m_folder / m_path.filename()).string();
}

void OutputPlace::Keep() {
    if (m_folder.empty()) return;
    try {
        for (const fs::directory_entry& file : fs::directory_iterator(m_folder)) {
            const fs::path target = m_folder.parent_path() / file.path().filename();
            // Another program may have written there meanwhile.
            if (!m_mayOverwrite && fs::exists(target))
                throw Failure(kExitOutput, ExistsText(target.string()));
            fs::rename(file.path(), target);
        }
    } catch (const fs::filesystem_error& error) {
        throw Failure(kExitOutput, m_name + ": cannot be written: " + error.code().message());
    }
}

}  // namespace velmora::hosts

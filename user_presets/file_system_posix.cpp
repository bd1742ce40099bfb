#include "user_presets/file_access.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <climits>
#include <cstdlib>
#include <memory>

namespace velmora {

bool MakeNativePath(const char* fileName, NativePath* path) {
    if (fileName == nullptr || *fileName == '\0') return false;
    // A link stays a link: its target is replaced.
    const std::unique_ptr<char, decltype(&std::free)> resolved(realpath(fileName, nullptr), &std::free);
    *path = resolved != nullptr ? resolved.get() : fileName;
    return true;
}

std::optional<std::string> FileNameFromUtf8(const std::string& path) {
    return path;
}

std::FILE* OpenForReading(const NativePath& path) {
    std::FILE* file = std::fopen(path.c_str(), "rb");
    struct stat status {};
    if (file != nullptr && (fstat(fileno(file), &status) != 0 || S_ISDIR(status.st_mode))) {
        std::fclose(file);
        return nullptr;
    }
    return file;
}

std::FILE* OpenForWriting(const NativePath& path) {
    return std::fopen(path.c_str(), "w");
}

std::FILE* CreateBeside(const NativePath& path, NativePath* beside) {
    struct stat status {};
    const bool exists = stat(path.c_str(), &status) == 0;
    // Renaming needs no permission on the file itself, but a write-protected preset must stay.
    if (exists && (!S_ISREG(status.st_mode) || faccessat(AT_FDCWD, path.c_str(), W_OK, AT_EACCESS) != 0))
        return nullptr;
    *beside = path.substr(0, path.rfind('/') + 1) + ".preset-XXXXXX";
    const int descriptor = mkstemp(beside->data());
    if (descriptor < 0) return nullptr;
    const mode_t mask = umask(0);
    umask(mask);
    const mode_t mode = exists ? status.st_mode & 07777 : 0666 & ~mask;
    std::FILE* file = fchmod(descriptor, mode) == 0 ? fdopen(descriptor, "w") : nullptr;
    if (file == nullptr) {
        close(descriptor);
        Remove(*beside);
    }
    return file;
}

bool RenameOver(const NativePath& beside, const NativePath& path) {
    return std::rename(beside.c_str(), path.c_str()) == 0;
}

void Remove(const NativePath& path) {
    unlink(path.c_str());
}

}  // namespace velmora

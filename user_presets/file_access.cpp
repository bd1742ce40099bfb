#include "user_presets/file_access.h"

#include <memory>

namespace velmora {

namespace {

// Also false when there is not enough memory to write: the file must be closed, and a half-written one removed.
bool Writes(std::FILE* file, const TextWriter& write) noexcept try { return write(file); } catch (...) {
    return false;
}

// Reports what buffered writing detects only at the end, such as a full disk.
bool WriteAndClose(std::FILE* file, const TextWriter& write) noexcept {
    const bool isWritten = Writes(file, write) && std::fflush(file) == 0 && std::ferror(file) == 0;
    return std::fclose(file) == 0 && isWritten;
}

struct FileCloser {
    void operator()(std::FILE* file) const noexcept { std::fclose(file); }
};

bool WriteInPlace(const NativePath& path, const TextWriter& write) {
    std::FILE* file = OpenForWriting(path);
    return file != nullptr && WriteAndClose(file, write);
}

}  // namespace

bool ReadWholeFile(const char* fileName, std::size_t limit, std::string* content) {
    NativePath path;
    if (!MakeNativePath(fileName, &path)) return false;
    const std::unique_ptr<std::FILE, FileCloser> file(OpenForReading(path));
    if (file == nullptr) return false;
    content->clear();
    char block[16384];
    std::size_t count = 0;
    while (content->size() <= limit && (count = std::fread(block, 1, sizeof block, file.get())) > 0) {
        content->append(block, count);
    }
    return std::ferror(file.get()) == 0 && !content->empty() && content->size() <= limit;
}

bool ReplaceTextFile(const char* fileName, const TextWriter& write) {
    NativePath path;
    if (!MakeNativePath(fileName, &path)) return false;
    NativePath beside;
    std::FILE* file = CreateBeside(path, &beside);
    if (file == nullptr) return WriteInPlace(path, write);
    if (!WriteAndClose(file, write)) {
        Remove(beside);
        return false;
    }
    if (RenameOver(beside, path)) return true;
    Remove(beside);
    return WriteInPlace(path, write);
}

}  // namespace velmora

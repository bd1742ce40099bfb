#include "user_presets/file_access.h"

#include <fcntl.h>
#include <io.h>
#include <sys/stat.h>
#include <windows.h>

#include "text/encodings.h"

namespace velmora {

bool MakeNativePath(const char* fileName, NativePath* path) {
    // In some hosts the C library's narrow functions would interpret the name in the console's code page.
    if (fileName == nullptr) return false;
    const std::u16string wide = Widen(fileName);
    path->assign(wide.begin(), wide.end());
    return !wide.empty();
}

std::optional<std::string> FileNameFromUtf8(const std::string& path) {
    const auto wide = Utf16FromUtf8(path);
    return wide ? NarrowExactly(*wide) : std::nullopt;
}

std::FILE* OpenForReading(const NativePath& path) {
    std::FILE* file = _wfopen(path.c_str(), L"rb");
    if (file == nullptr) return nullptr;
    // "COM1" in any folder is a device: reading from it would block for ever.
    const auto handle = reinterpret_cast<HANDLE>(_get_osfhandle(_fileno(file)));
    if (GetFileType(handle) == FILE_TYPE_DISK) return file;
    std::fclose(file);
    return nullptr;
}

// "t", as the host may have made binary mode the default.
std::FILE* OpenForWriting(const NativePath& path) {
    // Where Windows files are stored on another system's disk, administrator rights would bypass the write protection.
    const DWORD attributes = GetFileAttributesW(path.c_str());
    if (attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_READONLY) != 0) return nullptr;
    return _wfopen(path.c_str(), L"wt");
}

std::FILE* CreateBeside(const NativePath& path, NativePath* beside) {
    const DWORD attributes = GetFileAttributesW(path.c_str());
    const DWORD unfit = FILE_ATTRIBUTE_DIRECTORY | FILE_ATTRIBUTE_DEVICE | FILE_ATTRIBUTE_READONLY |
                        FILE_ATTRIBUTE_REPARSE_POINT;  // the last: a link stays a link
    if (attributes != INVALID_FILE_ATTRIBUTES && (attributes & unfit) != 0) return nullptr;
    const std::size_t folderEnd = path.find_last_of(L"\\/:");
    const NativePath folder = folderEnd == NativePath::npos ? L"" : path.substr(0, folderEnd + 1);
    const DWORD start = GetTickCount() ^ (GetCurrentProcessId() << 16);
    for (DWORD attempt = 0; attempt < 100; ++attempt) {
        wchar_t name[16];
        wsprintfW(name, L"~%08lx.tmp", static_cast<unsigned long>(start + attempt));
        *beside = folder + name;
        const int descriptor = _wopen(
            beside->c_str(), _O_CREAT | _O_EXCL | _O_WRONLY | _O_TEXT | _O_NOINHERIT, _S_IREAD | _S_IWRITE);
        if (descriptor >= 0) {
            std::FILE* file = _fdopen(descriptor, "wt");
            if (file == nullptr) {
                _close(descriptor);
                Remove(*beside);
            }
            return file;
        }
        if (errno != EEXIST) return nullptr;
    }
    return nullptr;
}

bool RenameOver(const NativePath& beside, const NativePath& path) {
    return MoveFileExW(beside.c_str(), path.c_str(), MOVEFILE_REPLACE_EXISTING | MOVEFILE_WRITE_THROUGH) != 0;
}

void Remove(const NativePath& path) {
    DeleteFileW(path.c_str());
}

}  // namespace velmora

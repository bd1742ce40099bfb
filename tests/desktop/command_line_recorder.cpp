// Stands in for a program that the library starts. Writes its command line (16-bit text) to the file named by the
// environment variable VELMORA_RECORD, under a temporary name first, so that a reader never sees half of it.
#include <windows.h>

#include <cstdio>

int main() {
    wchar_t path[MAX_PATH] = {};
    if (GetEnvironmentVariableW(L"VELMORA_RECORD", path, MAX_PATH) == 0) return 1;
    wchar_t unfinished[MAX_PATH + 8] = {};
    lstrcpyW(unfinished, path);
    lstrcatW(unfinished, L".part");
    std::FILE* file = _wfopen(unfinished, L"wb");
    if (file == nullptr) return 1;
    const wchar_t* line = GetCommandLineW();
    std::fwrite(line, sizeof(wchar_t), static_cast<std::size_t>(lstrlenW(line)), file);
    std::fclose(file);
    return MoveFileExW(unfinished, path, MOVEFILE_REPLACE_EXISTING) ? 0 : 1;
}

#include <windows.h>

#include <csignal>
#include <cstdio>
#include <cstring>
#include <stdexcept>

#include "programs/reelcheck/check.h"
#include "programs/reelcheck/child_process.h"

namespace velmora::reelcheck {

struct ChildProcess::System {
    HANDLE process = nullptr;
    HANDLE output = nullptr;
};

ChildProcess::ChildProcess(const std::vector<std::string>& arguments) : m_system(std::make_unique<System>()) {
    SECURITY_ATTRIBUTES inherited = {sizeof inherited, nullptr, TRUE};
    HANDLE writing = nullptr;
    if (!CreatePipe(&m_system->output, &writing, &inherited, 0)) throw std::runtime_error("no pipe");
    SetHandleInformation(m_system->output, HANDLE_FLAG_INHERIT, 0);
    char program[MAX_PATH] = "";
    GetModuleFileNameA(nullptr, program, MAX_PATH);
    std::string line = "\"" + std::string(program) + "\"";
    for (const std::string& argument : arguments) line += " \"" + argument + "\"";
    STARTUPINFOA start = {};
    start.cb = sizeof start;
    start.dwFlags = STARTF_USESTDHANDLES;
    start.hStdOutput = writing;
    start.hStdError = GetStdHandle(STD_ERROR_HANDLE);
    PROCESS_INFORMATION started = {};
    const BOOL isStarted =
        CreateProcessA(program, line.data(), nullptr, nullptr, TRUE, 0, nullptr, nullptr, &start, &started);
    CloseHandle(writing);
    if (!isStarted) {
        CloseHandle(m_system->output);
        throw std::runtime_error("the child process does not start");
    }
    CloseHandle(started.hThread);
    m_system->process = started.hProcess;
}

ChildProcess::~ChildProcess() {
    Kill();
    CloseHandle(m_system->process);
    CloseHandle(m_system->output);
}

// A pipe cannot be waited for with a time limit, so it is polled.
bool ChildProcess::ReadSome() {
    DWORD waiting = 0;
    if (!PeekNamedPipe(m_system->output, nullptr, 0, nullptr, &waiting, nullptr)) return false;
    if (waiting == 0) {
        Sleep(5);
        return true;
    }
    char bytes[4096];
    DWORD count = 0;
    if (!ReadFile(m_system->output, bytes, sizeof bytes, &count, nullptr) || count == 0) return false;
    m_read.append(bytes, count);
    return true;
}

void ChildProcess::Kill() {
    TerminateProcess(m_system->process, 1);
}

std::string ChildProcess::HowItEnded() {
    WaitForSingleObject(m_system->process, INFINITE);
    DWORD code = 0;
    GetExitCodeProcess(m_system->process, &code);
    return code == 0 ? "" : Text("exit code 0x%lX", code);
}

namespace {

// "name.dll+0x1234", which can be looked up in the module's map file.
void DescribeAddress(const void* address, char* text, std::size_t size) {
    HMODULE module = nullptr;
    char path[MAX_PATH] = "?";
    GetModuleHandleExA(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                       static_cast<const char*>(address), &module);
    GetModuleFileNameA(module, path, MAX_PATH);
    const char* const name = std::strrchr(path, '\\');
    const auto offset = static_cast<const char*>(address) - reinterpret_cast<const char*>(module);
    std::snprintf(text, size, "%s+0x%X", module == nullptr ? "?" : (name != nullptr ? name + 1 : path),
                  static_cast<unsigned>(offset));
}

LONG WINAPI OnException(EXCEPTION_POINTERS* pointers) {
    const EXCEPTION_RECORD& record = *pointers->ExceptionRecord;
    char where[300], line[700];
    DescribeAddress(record.ExceptionAddress, where, sizeof where);
    std::snprintf(line, sizeof line, "crash %s: exception 0x%lX in %s", Place(), record.ExceptionCode, where);
    if (record.ExceptionCode == EXCEPTION_ACCESS_VIOLATION && record.NumberParameters >= 2) {
        const std::size_t length = std::strlen(line);
        std::snprintf(line + length, sizeof line - length, ", %s 0x%lX",
                      record.ExceptionInformation[0] != 0 ? "writing" : "reading",
                      static_cast<unsigned long>(record.ExceptionInformation[1]));
    }
    std::strcat(line, "\n");
    WriteLine(line);
    EndNow(3);
}

// A library that ends in std::terminate gets here, because it shares the C library with this program.
void OnAbort(int) {
    char line[512];
    std::snprintf(line, sizeof line, "crash %s: aborted\n", Place());
    WriteLine(line);
    EndNow(3);
}

}  // namespace

void ReportCrashes() {
    SetErrorMode(SEM_FAILCRITICALERRORS | SEM_NOGPFAULTERRORBOX);
    SetUnhandledExceptionFilter(OnException);
    std::signal(SIGABRT, OnAbort);
}

void WriteLine(const char* text) noexcept {
    DWORD count = 0;
    WriteFile(GetStdHandle(STD_OUTPUT_HANDLE), text, static_cast<DWORD>(std::strlen(text)), &count, nullptr);
}

void EndNow(int code) noexcept {
    TerminateProcess(GetCurrentProcess(), static_cast<UINT>(code));
    for (;;) {
    }
}

}  // namespace velmora::reelcheck

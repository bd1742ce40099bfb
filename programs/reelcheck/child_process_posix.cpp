#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstring>
#include <stdexcept>

#include "programs/reelcheck/check.h"
#include "programs/reelcheck/child_process.h"

namespace velmora::reelcheck {

struct ChildProcess::System {
    pid_t process = -1;
    int output = -1;
    int status = 0;
    bool isOver = false;
};

ChildProcess::ChildProcess(const std::vector<std::string>& arguments) : m_system(std::make_unique<System>()) {
    int ends[2];
    if (pipe2(ends, O_CLOEXEC) != 0) throw std::runtime_error("no pipe");
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_adddup2(&actions, ends[1], STDOUT_FILENO);
    std::vector<char*> words = {const_cast<char*>("reelcheck")};
    for (const std::string& argument : arguments) words.push_back(const_cast<char*>(argument.c_str()));
    words.push_back(nullptr);
    const int error =
        posix_spawn(&m_system->process, "/proc/self/exe", &actions, nullptr, words.data(), environ);
    posix_spawn_file_actions_destroy(&actions);
    close(ends[1]);
    m_system->output = ends[0];
    if (error != 0) {
        close(ends[0]);
        throw std::runtime_error("the child process does not start");
    }
}

ChildProcess::~ChildProcess() {
    Kill();
    static_cast<void>(HowItEnded());
    close(m_system->output);
}

bool ChildProcess::ReadSome() {
    pollfd waiting = {m_system->output, POLLIN, 0};
    if (poll(&waiting, 1, 50) <= 0) return true;
    char bytes[4096];
    const ssize_t count = read(m_system->output, bytes, sizeof bytes);
    if (count <= 0) return false;
    m_read.append(bytes, static_cast<std::size_t>(count));
    return true;
}

void ChildProcess::Kill() {
    if (!m_system->isOver) kill(m_system->process, SIGKILL);
}

std::string ChildProcess::HowItEnded() {
    if (!m_system->isOver) m_system->isOver = waitpid(m_system->process, &m_system->status, 0) >= 0;
    if (WIFSIGNALED(m_system->status)) return Text("signal %d", WTERMSIG(m_system->status));
    const int code = WEXITSTATUS(m_system->status);
    return code == 0 ? "" : Text("exit code %d", code);
}

#if defined(__SANITIZE_ADDRESS__)

extern "C" void __sanitizer_set_death_callback(void (*callback)());

// The sanitizer reports the crash itself on standard error.
void ReportCrashes() {
    __sanitizer_set_death_callback([] {
        char line[512];
        std::snprintf(line, sizeof line, "crash %s: stopped by the sanitizer\n", Place());
        WriteLine(line);
    });
}

#else

namespace {

void OnCrash(int signal, siginfo_t* info, void*) {
    char line[512];
    const char* const name = sigabbrev_np(signal);
    std::snprintf(line, sizeof line, "crash %s: SIG%s at %p\n", Place(), name != nullptr ? name : "?",
                  info->si_addr);
    WriteLine(line);
    EndNow(128 + signal);
}

}  // namespace

void ReportCrashes() {
    struct sigaction action = {};
    action.sa_sigaction = OnCrash;
    action.sa_flags = static_cast<int>(SA_SIGINFO | SA_RESETHAND);
    for (const int signal : {SIGSEGV, SIGBUS, SIGILL, SIGFPE, SIGABRT}) sigaction(signal, &action, nullptr);
}

#endif

void WriteLine(const char* text) noexcept {
    std::size_t length = std::strlen(text);
    while (length != 0) {
        const ssize_t count = write(STDOUT_FILENO, text, length);
        if (count <= 0) return;
        text += count;
        length -= static_cast<std::size_t>(count);
    }
}

void EndNow(int code) noexcept {
    _exit(code);
}

}  // namespace velmora::reelcheck

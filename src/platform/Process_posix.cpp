// Child processes on POSIX: posix_spawn and waitpid.
#include "platform/Process.h"

#include <cerrno>
#include <csignal>
#include <ctime>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

extern char** environ;

namespace tekit::platform {

namespace {

pid_t PidOf(ProcessHandle process) {
    return static_cast<pid_t>(reinterpret_cast<std::intptr_t>(process));
}

/// Pointers to the texts, ending with a null one, as exec wants them.
std::vector<char*> Pointers(std::vector<std::string>& texts) {
    std::vector<char*> pointers;
    for (std::string& text : texts)
        pointers.push_back(text.data());
    pointers.push_back(nullptr);
    return pointers;
}

} // namespace

std::string CurrentProgramPath() {
    char path[4096];
    ssize_t const length = ::readlink("/proc/self/exe", path, sizeof path - 1);
    return length > 0 ? std::string(path, std::size_t(length)) : std::string();
}

SystemError StartProcess(char const* program, std::vector<std::string> const& arguments,
                         std::vector<std::string> const& environment, ProcessHandle& process) {
    std::vector<std::string> argv{program};
    argv.insert(argv.end(), arguments.begin(), arguments.end());
    std::vector<std::string> envp;
    for (char** entry = environ; *entry != nullptr; ++entry)
        envp.emplace_back(*entry);
    envp.insert(envp.end(), environment.begin(), environment.end());
    std::vector<char*> argvPointers = Pointers(argv), envpPointers = Pointers(envp);
    pid_t pid = 0;
    if (int const rc = ::posix_spawn(&pid, program, nullptr, nullptr, argvPointers.data(),
                                     envpPointers.data()))
        return {"posix_spawn", rc};
    process = reinterpret_cast<ProcessHandle>(static_cast<std::intptr_t>(pid));
    return {};
}

bool WaitForProcess(ProcessHandle process, std::uint32_t timeoutMs, int& exitCode) {
    timespec const pause = {0, 5 * 1000 * 1000};
    for (std::uint32_t waited = 0;; waited += 5) {
        int status = 0;
        pid_t const done = ::waitpid(PidOf(process), &status, WNOHANG);
        if (done == PidOf(process)) {
            exitCode = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
            return true;
        }
        if (done < 0 || waited >= timeoutMs)
            return false;
        ::nanosleep(&pause, nullptr);
    }
}

void CloseProcess(ProcessHandle process) {
    int status = 0;
    if (::waitpid(PidOf(process), &status, WNOHANG) == 0) {
        ::kill(PidOf(process), SIGKILL);
        ::waitpid(PidOf(process), &status, 0);
    }
}

} // namespace tekit::platform

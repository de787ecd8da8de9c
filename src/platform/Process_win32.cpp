// Child processes on Windows: CreateProcessA, WaitForSingleObject, TerminateProcess.
#include "platform/Process.h"
#include "platform/Win32.h"

#include <cstring>

namespace tekit::platform {

namespace {

/// One argument quoted as the runtime's command-line parser reads it back.
void AppendQuoted(std::string& line, std::string const& argument) {
    line += " \"";
    std::size_t backslashes = 0;
    for (char const c : argument) {
        if (c == '\\') {
            ++backslashes;
            continue;
        }
        line.append(c == '"' ? backslashes * 2 + 1 : backslashes, '\\');
        backslashes = 0;
        line += c;
    }
    line.append(backslashes * 2, '\\');
    line += '"';
}

/// This process's environment block with `extra` added at its end.
std::string EnvironmentBlock(std::vector<std::string> const& extra) {
    std::string block;
    if (char* const strings = ::GetEnvironmentStringsA()) {
        for (char const* entry = strings; *entry != '\0'; entry += std::strlen(entry) + 1)
            block.append(entry, std::strlen(entry) + 1);
        ::FreeEnvironmentStringsA(strings);
    }
    for (std::string const& entry : extra)
        block.append(entry.c_str(), entry.size() + 1);
    block += '\0';
    return block;
}

} // namespace

std::string CurrentProgramPath() {
    char path[MAX_PATH * 4];
    DWORD const length = ::GetModuleFileNameA(nullptr, path, sizeof path);
    return length > 0 && length < sizeof path ? std::string(path, length) : std::string();
}

SystemError StartProcess(char const* program, std::vector<std::string> const& arguments,
                         std::vector<std::string> const& environment, ProcessHandle& process) {
    std::string line;
    AppendQuoted(line, program);
    for (std::string const& argument : arguments)
        AppendQuoted(line, argument);
    std::string block = EnvironmentBlock(environment);
    STARTUPINFOA startup = {};
    startup.cb = sizeof startup;
    PROCESS_INFORMATION info = {};
    if (!::CreateProcessA(program, line.data(), nullptr, nullptr, FALSE, 0, block.data(), nullptr,
                          &startup, &info))
        return {"CreateProcessA", static_cast<long>(::GetLastError())};
    ::CloseHandle(info.hThread);
    process = info.hProcess;
    return {};
}

bool WaitForProcess(ProcessHandle process, std::uint32_t timeoutMs, int& exitCode) {
    if (::WaitForSingleObject(process, timeoutMs) != WAIT_OBJECT_0)
        return false;
    DWORD code = 0;
    ::GetExitCodeProcess(process, &code);
    exitCode = static_cast<int>(code);
    return true;
}

void CloseProcess(ProcessHandle process) {
    if (::WaitForSingleObject(process, 0) == WAIT_TIMEOUT) {
        ::TerminateProcess(process, 1);
        ::WaitForSingleObject(process, INFINITE);
    }
    ::CloseHandle(process);
}

} // namespace tekit::platform

// Child processes: start a program, wait for it with a bound, end it.
//
//   ProcessHandle child = nullptr;
//   if (SystemError const error = StartProcess(CurrentProgramPath().c_str(),
//                                              {"--gtest_filter=Child.*"}, {"ROLE=child"}, child))
//       ...
//   int exitCode = 0;
//   bool const ended = WaitForProcess(child, 10000, exitCode);
//   CloseProcess(child);   // ends it first when it still runs
#pragma once

#include "platform/SystemError.h"

#include <cstdint>
#include <string>
#include <vector>

namespace tekit::platform {

/// A started child process; null is none.
using ProcessHandle = void*;

/// The running program's file.
std::string CurrentProgramPath();
/// Starts `program` with `arguments` and this process's environment plus `environment`
/// ("NAME=value" entries).
SystemError StartProcess(char const* program, std::vector<std::string> const& arguments,
                         std::vector<std::string> const& environment, ProcessHandle& process);
/// Waits up to `timeoutMs` for the process to end; false when it still runs.
bool WaitForProcess(ProcessHandle process, std::uint32_t timeoutMs, int& exitCode);
/// Ends the process if it still runs and forgets it.
void CloseProcess(ProcessHandle process);

} // namespace tekit::platform

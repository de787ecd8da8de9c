// The tool's commands. Each command lives in its own file and adds itself to the application
// with one Add...Command function, so a new command is one new file and one line in main.cpp.
//
//   CLI::App app;
//   ToolContext context;
//   AddErrorCommand(app, context);
#pragma once

#include <stdexcept>
#include <string>

namespace CLI {
class App;
}

namespace tekit::tool {

/// Exit statuses: 0 success, 1 the command failed (message on standard error), 2 the command
/// line was wrong.
enum ExitStatus { kSuccess = 0, kFailure = 1, kUsageError = 2 };

/// Settings shared by every command.
struct ToolContext {
    /// Print JSON instead of text (the global --json flag or a command's own).
    bool json = false;
};

/// A command that could not do what was asked: main prints "tekit: <what>" to standard error
/// and exits with kFailure.
class ToolError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// Adds --json to a command as well, so it may follow the command's own arguments.
void AddJsonFlag(CLI::App& command, ToolContext& context);

void AddErrorCommand(CLI::App& app, ToolContext& context);
void AddDemoCommand(CLI::App& app, ToolContext& context);
void AddPathCommand(CLI::App& app, ToolContext& context);

} // namespace tekit::tool

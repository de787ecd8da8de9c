// The tool's commands. Each command lives in its own file and describes itself with a Command
// (name, help text, options, run function); main.cpp only looks the name up and runs it, so a
// new command is one new file and one line in AllCommands().
//
//   tekit path check 'C:\data\report.ini'   ->  Command "path check", arguments {"C:\..."}
#pragma once

#include <map>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace tekit::tool {

/// Exit statuses: 0 success; 1 a finding or a failure (explained on standard error); 2 the
/// command line was wrong.
enum ExitStatus { kSuccess = 0, kFailure = 1, kUsageError = 2 };

/// A command that could not do what was asked at all: main prints "tekit: <what>" to
/// standard error and exits with kFailure.
class ToolError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// An option a command takes besides --json and --help. `valueName` is null for a flag.
struct OptionSpec {
    char const* name;
    char const* valueName;
};

/// A parsed command line, as a command's run function receives it.
struct Invocation {
    std::vector<std::string> arguments;
    std::map<std::string, std::string> options;
    /// Every option that takes a value, in command-line order, repeated ones included
    /// (`options` keeps the last value of each).
    std::vector<std::pair<std::string, std::string>> values;
    bool json = false;

    bool Has(std::string const& option) const { return options.count(option) != 0; }
};

struct Command {
    /// "error", or "path check" for a command of a group.
    char const* name;
    /// One line, shown in the list of commands.
    char const* summary;
    /// The usage line without "Usage: ".
    char const* usage;
    /// The rest of the help: what it does, options, examples, exit status.
    char const* details;
    std::vector<OptionSpec> options;
    int (*run)(Invocation const&);
};

std::vector<Command> const& DemoCommands();
std::vector<Command> const& ErrorCommands();
std::vector<Command> const& PathCommands();
std::vector<Command> const& RangeCommands();
std::vector<Command> const& VersionCommands();
std::vector<Command> const& GrepCommands();
std::vector<Command> const& ExeCommands();
std::vector<Command> const& EnvCommands();
std::vector<Command> const& IniCommands();
std::vector<Command> const& CompressCommands();
std::vector<Command> const& InfoCommands();
std::vector<Command> const& StringsCommands();

/// A word that gathers commands ("path" for "path check", ...): its own help.
struct CommandGroup {
    char const* name;
    char const* summary;
    char const* details;
};
CommandGroup const& PathGroup();
CommandGroup const& VersionGroup();
CommandGroup const& IniGroup();
CommandGroup const& StringsGroup();

} // namespace tekit::tool

// The tool's command-line parsing: options and arguments of one command, and the usage error
// that names the word it did not understand.
//
//   Invocation call = ParseArguments(words, {{"--max", "N"}});   // throws UsageError
#pragma once

#include "Commands.h"

#include <stdexcept>
#include <string>
#include <vector>

namespace tekit::tool {

/// A command line the tool cannot take: main prints "tekit: <what>", the usage line of
/// `command` (empty: the tool's own) and exits with kUsageError.
class UsageError : public std::runtime_error {
public:
    UsageError(std::string const& what, std::string command)
        : std::runtime_error(what), m_command(std::move(command)) {}
    std::string const& Command() const { return m_command; }

private:
    std::string m_command;
};

/// `text` in double quotes, for messages: Windows paths hold no double quote, so the quotes
/// are never part of the word.
std::string Quote(std::string const& text);

/// Splits `words` into options (--name, --name=value, --name value, and -x where a command
/// defines one) and arguments. "--" ends the options; "-" and negative numbers ("-17208") are
/// arguments. --json sets Invocation::json and --help (-h) appears as option "--help".
Invocation ParseArguments(std::vector<std::string> const& words,
                          std::vector<OptionSpec> const& options, std::string const& command);

} // namespace tekit::tool

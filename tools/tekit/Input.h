// Where a command's inputs come from, and how it reports a problem with one of them.
//
//   for (InputItem const& item : CollectInputs(call.arguments)) {   // "-": standard input
//       if (!Handle(item.text))
//           findings.Report(item, "cannot ...");   // tekit: <stdin>:3: cannot ...
//   }
//   return findings.Status();
#pragma once

#include <iosfwd>
#include <string>
#include <vector>

namespace tekit::tool {

/// One input: a command-line argument, or a line of standard input with its line number.
struct InputItem {
    std::string text;
    int line = 0; // 0: from the command line

    /// "<stdin>:3: " for a line of standard input, "" for an argument.
    std::string Location() const;
};

/// The arguments in order, each "-" replaced by the lines of `in` (read once; a line's
/// trailing carriage return, from a Windows file, is dropped).
std::vector<InputItem> CollectInputs(std::vector<std::string> const& arguments, std::istream& in);
std::vector<InputItem> CollectInputs(std::vector<std::string> const& arguments);

/// Problems found while a command runs: each goes to standard error at once, as
/// "tekit: <location><message>", and makes the command's status kFailure.
class Findings {
public:
    void Report(InputItem const& item, std::string const& message);
    int Status() const;

private:
    int m_count = 0;
};

} // namespace tekit::tool

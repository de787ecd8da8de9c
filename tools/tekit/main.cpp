// tekit: the command-line tool over the library.
//
//   tekit --version
//   tekit error TE_FILE_NOT_FOUND
//   tekit --json error --all
//   tekit path check 'C:\data\report.ini'
//   tekit demo
#include "Arguments.h"
#include "Commands.h"
#include "Output.h"

#include "tekit/errors/TEException.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <exception>
#include <iostream>
#include <streambuf>

using namespace tekit::tool;

namespace {

char const kToolUsage[] = "tekit [--json] COMMAND [ARGUMENTS...]\n"
                          "       tekit help [COMMAND]\n"
                          "       tekit -V | --version [--json]";

char const kToolDetails[] =
    R"(Options:
  --json         Print JSON instead of text (before or after the command)
  -V, --version  Print the version ("tekit 0.1.0") and exit
  -h, --help     Print this help, or a command's help after the command

Commands that take paths or codes read them from standard input, one per line, when given
"-". Problems go to standard error as "tekit: <what>", with "<stdin>:LINE: " when the input
came from standard input.

Examples:
  tekit error -17208
  tekit path check 'C:\data\report.ini' 'C:\a\\b'
  tekit --json demo | python3 -m json.tool

Exit status:
  0  success
  1  a finding (an invalid path, an unknown code) or a failure, explained on standard error
  2  the command line was wrong
)";

std::vector<Command> const& AllCommands() {
    static std::vector<Command> const commands = [] {
        std::vector<Command> all;
        for (auto const* list :
             {&DemoCommands(), &ErrorCommands(), &PathCommands(), &RangeCommands(),
              &VersionCommands(), &GrepCommands(), &IniCommands(), &ExeCommands(), &EnvCommands(),
              &CompressCommands(), &InfoCommands(), &StringsCommands()})
            all.insert(all.end(), list->begin(), list->end());
        return all;
    }();
    return commands;
}

std::vector<CommandGroup const*> const& AllGroups() {
    static std::vector<CommandGroup const*> const groups{&PathGroup(), &VersionGroup(), &IniGroup(),
                                                         &StringsGroup()};
    return groups;
}

CommandGroup const* FindGroup(std::string const& name) {
    for (CommandGroup const* group : AllGroups())
        if (name == group->name)
            return group;
    return nullptr;
}

Command const* FindCommand(std::string const& name) {
    for (Command const& command : AllCommands())
        if (name == command.name)
            return &command;
    return nullptr;
}

std::string GroupUsage(std::string const& group) {
    return "tekit " + group + " COMMAND [ARGUMENTS...]";
}

/// "  name  summary" lines for the commands directly under `prefix` ("" or "path "); a
/// group shows once, with its own summary.
void PrintCommandList(std::string const& prefix) {
    std::vector<std::vector<std::string>> rows;
    for (Command const& command : AllCommands()) {
        std::string const name = std::string(command.name);
        if (name.rfind(prefix, 0) != 0)
            continue;
        std::string const rest = name.substr(prefix.size());
        std::string const word = rest.substr(0, rest.find(' '));
        if (!rows.empty() && rows.back()[0] == word)
            continue;
        CommandGroup const* group = word != rest ? FindGroup(word) : nullptr;
        rows.push_back({word, group ? group->summary : command.summary});
    }
    if (prefix.empty())
        rows.push_back({"help", "Show the help of the tool or of a command"});
    PrintTable(std::cout, rows, 2);
}

void PrintToolHelp() {
    std::cout << "Usage: " << kToolUsage << "\n\n"
              << "Inspect and check the data of the Orvane foundation library.\n\nCommands:\n";
    PrintCommandList("");
    std::cout << '\n' << kToolDetails;
}

void PrintGroupHelp(CommandGroup const& group) {
    std::cout << "Usage: " << GroupUsage(group.name) << "\n\n" << group.summary << ".\n\n";
    std::cout << "Commands:\n";
    PrintCommandList(std::string(group.name) + " ");
    std::cout << '\n' << group.details;
}

void PrintCommandHelp(Command const& command) {
    std::cout << "Usage: " << command.usage << "\n\n"
              << command.summary << ".\n\n"
              << command.details;
}

/// `tekit help [COMMAND [SUBCOMMAND]]`.
int RunHelp(std::vector<std::string> const& words) {
    Invocation const call = ParseArguments(words, {}, "help");
    std::string name;
    for (std::string const& word : call.arguments)
        name += (name.empty() ? "" : " ") + word;
    if (name.empty())
        PrintToolHelp();
    else if (Command const* command = FindCommand(name))
        PrintCommandHelp(*command);
    else if (CommandGroup const* group = FindGroup(name))
        PrintGroupHelp(*group);
    else
        throw UsageError("no command " + Quote(Shown(name)), "help");
    return kSuccess;
}

int PrintVersion(bool json) {
    if (json)
        std::cout
            << Record().AddText("name", "tekit").AddText("version", TEKIT_VERSION_TEXT).ToJson()
            << '\n';
    else
        std::cout << "tekit " TEKIT_VERSION_TEXT "\n";
    return kSuccess;
}

int RunCommand(Command const& command, std::vector<std::string> const& words, bool json) {
    Invocation call = ParseArguments(words, command.options, command.name);
    call.json = call.json || json;
    if (call.Has("--help")) {
        PrintCommandHelp(command);
        return kSuccess;
    }
    return command.run(call);
}

/// `tekit path ...`: options may stand between the group and its command.
int RunGroup(CommandGroup const& group, std::vector<std::string> words, bool json) {
    bool help = false;
    while (!words.empty() && (words[0] == "--json" || words[0] == "--help" || words[0] == "-h")) {
        (words[0] == "--json" ? json : help) = true;
        words.erase(words.begin());
    }
    if (words.empty() || help) {
        if (!help)
            throw UsageError(std::string(group.name) + " needs a command (\"tekit help " +
                                 group.name + "\" lists them)",
                             group.name);
        PrintGroupHelp(group);
        return kSuccess;
    }
    Command const* command = FindCommand(std::string(group.name) + " " + words[0]);
    if (!command)
        throw UsageError("unknown " + std::string(group.name) + " command " +
                             Quote(Shown(words[0])),
                         group.name);
    return RunCommand(*command, {words.begin() + 1, words.end()}, json);
}

int Run(std::vector<std::string> const& words) {
    bool json = false, version = false, help = false;
    size_t i = 0;
    for (; i < words.size() && words[i].size() > 1 && words[i][0] == '-'; ++i) {
        std::string const& word = words[i];
        if (word == "--json")
            json = true;
        else if (word == "-V" || word == "--version")
            version = true;
        else if (word == "-h" || word == "--help")
            help = true;
        else
            throw UsageError("unknown option " + Quote(Shown(word)), "");
    }
    std::vector<std::string> const rest(words.begin() + static_cast<long>(i), words.end());
    if (version && rest.empty())
        return PrintVersion(json);
    if (version)
        throw UsageError("unexpected " + Quote(Shown(rest[0])) + " after --version", "");
    if (help || (!rest.empty() && rest[0] == "help"))
        return RunHelp(help ? rest : std::vector<std::string>(rest.begin() + 1, rest.end()));
    if (rest.empty())
        throw UsageError("no command given", "");
    if (CommandGroup const* group = FindGroup(rest[0]))
        return RunGroup(*group, {rest.begin() + 1, rest.end()}, json);
    if (Command const* command = FindCommand(rest[0]))
        return RunCommand(*command, {rest.begin() + 1, rest.end()}, json);
    throw UsageError("unknown command " + Quote(Shown(rest[0])), "");
}

int ShowUsageError(UsageError const& e) {
    std::string const& name = e.Command();
    std::string usage = kToolUsage;
    if (Command const* command = FindCommand(name))
        usage = command->usage;
    else if (FindGroup(name))
        usage = GroupUsage(name);
    else if (name == "help")
        usage = "tekit help [COMMAND]";
    std::cerr << "tekit: " << e.what() << "\nUsage: " << usage << "\nTry \"tekit help"
              << (name.empty() || name == "help" ? "" : " " + name) << "\" for more.\n";
    return kUsageError;
}

int Fail(char const* what) {
    std::cerr << "tekit: " << what << '\n';
    return kFailure;
}

/// Standard output through a buffer of the tool's own, which keeps the reason of the first
/// failed write: output that did not reach its file (a full disk, a closed pipe) is a failure,
/// never a silent success.
class StdoutBuffer : public std::streambuf {
public:
    StdoutBuffer() { setp(m_buffer, m_buffer + sizeof m_buffer); }
    /// The errno of the failed write, -1 when all went well.
    int Error() const { return m_error; }

protected:
    int overflow(int c) override {
        if (!Drain())
            return traits_type::eof();
        if (c != traits_type::eof()) {
            *pptr() = static_cast<char>(c);
            pbump(1);
        }
        return traits_type::not_eof(c);
    }
    int sync() override { return Drain() ? 0 : -1; }

private:
    bool Drain() {
        auto const size = static_cast<size_t>(pptr() - pbase());
        if (size && m_error < 0) {
            errno = 0;
            if (std::fwrite(pbase(), 1, size, stdout) != size || std::fflush(stdout) != 0)
                m_error = errno;
        }
        setp(m_buffer, m_buffer + sizeof m_buffer);
        return m_error < 0;
    }

    char m_buffer[8192];
    int m_error = -1;
};

int FinishOutput(StdoutBuffer& buffer, int status) {
    std::cout.flush();
    if (buffer.Error() < 0)
        return status;
    std::cerr << "tekit: cannot write to standard output: "
              << (buffer.Error() ? std::strerror(buffer.Error()) : "write error") << '\n';
    return status == kUsageError ? kUsageError : kFailure;
}

} // namespace

int main(int argc, char** argv) {
    std::vector<std::string> const words(argv + 1, argv + argc);
    StdoutBuffer buffer;
    std::streambuf* const standard = std::cout.rdbuf(&buffer);
    int status = kSuccess;
    try {
        status = Run(words);
        std::cout.flush();
    } catch (UsageError const& e) {
        status = ShowUsageError(e);
    } catch (ToolError const& e) {
        status = Fail(e.what());
    } catch (tekit::TEException const& e) {
        status = Fail(e.GetDescription());
    } catch (std::exception const& e) {
        status = Fail(e.what());
    }
    status = FinishOutput(buffer, status);
    std::cout.rdbuf(standard);
    return status;
}

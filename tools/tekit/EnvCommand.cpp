// tekit env: the installation's well-known directories as the library resolves them here.
//
//   tekit env
//   tekit env --json
#include "Arguments.h"
#include "Commands.h"
#include "Output.h"

#include "tekit/environment/KnownDirectories.h"
#include "tekit/errors/TEException.h"
#include "tekit/strings/StringVector.h"

#include <iostream>

namespace tekit::tool {

namespace {

char const kDetails[] =
    R"(Prints the directories the library uses, each ending in the host's separator: binaries
(the directory of the library itself), developmentBinaries (its "modules" sub-directory,
where a build tree keeps loadable modules), configuration, public, applicationData, cache and
temporary, then languageConfiguration and the language directories that the strings loader
searches for LANGUAGE (default "English"), in the order it reads them. On Windows they come
from the Known Folders and the library's own file; elsewhere from the XDG base-directory
variables (XDG_CONFIG_HOME, XDG_DATA_HOME, XDG_DATA_DIRS, XDG_CACHE_HOME, TMPDIR, HOME) and
the library's own file. Nothing is created.

Given NAMEs, prints only those directories (any of the seven above), in that order. JSON
gives one object with a member per directory, "languageDirectories" an array.

Options:
  --language LANGUAGE  The language whose directories to show
  --json               Print JSON: one object
  -h, --help           Print this help

Examples:
  tekit env
  tekit env configuration cache
  XDG_CONFIG_HOME=/etc/xdg tekit env --json

Exit status:
  0  every directory was found
  1  a directory could not be found (why: on standard error; the others are still shown)
  2  the command line was wrong
)";

/// The directory named `name`, as KnownDirectoryName names it; false for another name.
bool FindDirectory(std::string const& name, KnownDirectory& which) {
    for (int i = 0; i < kKnownDirectoryCount; ++i)
        if (name == KnownDirectoryName(static_cast<KnownDirectory>(i))) {
            which = static_cast<KnownDirectory>(i);
            return true;
        }
    return false;
}

/// `tekit env NAME...`: only the named directories, in the order given.
int RunNamed(Invocation const& call) {
    std::vector<KnownDirectory> wanted;
    for (std::string const& name : call.arguments) {
        KnownDirectory which{};
        if (!FindDirectory(name, which))
            throw UsageError("no directory " + Quote(Shown(name)) + " (binaries, " +
                                 "developmentBinaries, configuration, public, applicationData, "
                                 "cache, temporary)",
                             "env");
        wanted.push_back(which);
    }
    Record record;
    int status = kSuccess;
    for (KnownDirectory const which : wanted) {
        try {
            record.AddText(KnownDirectoryName(which), GetKnownDirectory(which).CStr());
        } catch (TEException const& e) {
            std::cerr << "tekit: " << e.GetDescription() << '\n';
            status = kFailure;
        }
    }
    if (call.json)
        std::cout << record.ToJson() << '\n';
    else
        record.PrintText(std::cout);
    return status;
}

int RunEnv(Invocation const& call) {
    if (!call.arguments.empty())
        return RunNamed(call);
    std::string const language =
        call.Has("--language") ? call.options.at("--language") : std::string("English");
    if (language.empty())
        throw UsageError("--language needs a language name, not \"\"", "env");
    Record record;
    int status = kSuccess;
    for (int i = 0; i < kKnownDirectoryCount; ++i) {
        auto const which = static_cast<KnownDirectory>(i);
        try {
            record.AddText(KnownDirectoryName(which), GetKnownDirectory(which).CStr());
        } catch (TEException const& e) {
            std::cerr << "tekit: " << e.GetDescription() << '\n';
            status = kFailure;
        }
    }
    KnownDirectoryGetter getter;
    try {
        DynamicString configuration;
        getter.GetLanguageConfigurationDirectory(configuration);
        record.AddText("languageConfiguration", configuration.GetBufferReadPtr());
    } catch (TEException const& e) {
        std::cerr << "tekit: " << e.GetDescription() << '\n';
        status = kFailure;
    }
    StringVector directories;
    getter.GetLanguageDirectories(DynamicString(language.c_str()), directories);
    std::vector<std::string> json;
    std::string text;
    for (DynamicString const& directory : directories) {
        json.push_back(JsonQuote(directory.GetBufferReadPtr()));
        text += (text.empty() ? "" : "  ") + Shown(directory.GetBufferReadPtr());
    }
    std::string array = "[";
    for (std::size_t i = 0; i < json.size(); ++i)
        array += (i ? ", " : "") + json[i];
    record.AddText("language", language).AddJson("languageDirectories", array + "]", text);
    if (call.json)
        std::cout << record.ToJson() << '\n';
    else
        record.PrintText(std::cout);
    return status;
}

} // namespace

std::vector<Command> const& EnvCommands() {
    static std::vector<Command> const commands{
        {"env",
         "Show the installation's well-known directories",
         "tekit env [--language LANGUAGE] [--json] [NAME...]",
         kDetails,
         {{"--language", "LANGUAGE"}},
         RunEnv},
    };
    return commands;
}

} // namespace tekit::tool

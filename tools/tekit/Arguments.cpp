#include "Arguments.h"

#include "Output.h"

#include <cctype>

namespace tekit::tool {

namespace {

bool IsNegativeNumber(std::string const& word) {
    return word.size() > 1 && word[0] == '-' && std::isdigit(static_cast<unsigned char>(word[1]));
}

OptionSpec const* FindOption(std::vector<OptionSpec> const& options, std::string const& name) {
    for (OptionSpec const& option : options)
        if (name == option.name)
            return &option;
    return nullptr;
}

/// Takes the option at words[i] (and its value, which may be the next word) into `call`.
void TakeOption(std::vector<std::string> const& words, size_t& i,
                std::vector<OptionSpec> const& options, std::string const& command,
                Invocation& call) {
    std::string const& word = words[i];
    size_t const equals = word.find('=');
    std::string const name = word.substr(0, equals);
    if (name == "--json" || name == "--help" || name == "-h") {
        if (equals != std::string::npos)
            throw UsageError("option " + name + " takes no value", command);
        name == "--json" ? void(call.json = true) : void(call.options["--help"] = "");
        return;
    }
    OptionSpec const* spec = FindOption(options, name); // "--name", or "-x" where one is defined
    if (!spec)
        throw UsageError("unknown option " + Quote(Shown(word)), command);
    if (!spec->valueName) {
        if (equals != std::string::npos)
            throw UsageError("option " + name + " takes no value", command);
        call.options[name] = "";
    } else if (equals != std::string::npos) {
        call.options[name] = word.substr(equals + 1);
        call.values.emplace_back(name, call.options[name]);
    } else if (i + 1 < words.size()) {
        call.options[name] = words[++i];
        call.values.emplace_back(name, call.options[name]);
    } else {
        throw UsageError("option " + name + " needs a value (" + spec->valueName + ")", command);
    }
}

} // namespace

std::string Quote(std::string const& text) {
    return "\"" + text + "\"";
}

Invocation ParseArguments(std::vector<std::string> const& words,
                          std::vector<OptionSpec> const& options, std::string const& command) {
    Invocation call;
    bool optionsEnded = false;
    for (size_t i = 0; i < words.size(); ++i) {
        std::string const& word = words[i];
        if (optionsEnded || word.size() < 2 || word[0] != '-' || IsNegativeNumber(word))
            call.arguments.push_back(word);
        else if (word == "--")
            optionsEnded = true;
        else
            TakeOption(words, i, options, command, call);
    }
    return call;
}

} // namespace tekit::tool

// tekit error CODE|SYMBOL, tekit error --all: the error table with each code's message.
#include "Commands.h"
#include "Output.h"

#include "tekit/errors/TEError.h"

#include <CLI/CLI.hpp>

#include <charconv>
#include <iostream>
#include <memory>

namespace tekit::tool {

namespace {

struct ErrorArguments {
    std::string code;
    bool all = false;
};

/// An optional minus sign and digits: meant as a code, whether or not it fits 32 bits.
bool LooksLikeNumber(std::string const& text) {
    size_t const start = !text.empty() && text[0] == '-' ? 1 : 0;
    return text.size() > start && text.find_first_not_of("0123456789", start) == std::string::npos;
}

/// A code given as a number ("-17208") or as its symbol ("TE_FILE_NOT_FOUND").
TEError ResolveCode(std::string const& text) {
    if (LooksLikeNumber(text)) {
        std::int32_t number = 0;
        std::errc const error = std::from_chars(text.data(), text.data() + text.size(), number).ec;
        if (error != std::errc() || *TEErrorToStringSymbol(static_cast<TEError>(number)) == '\0')
            throw ToolError(text + " is not a TEError code");
        return static_cast<TEError>(number);
    }
    bool found = false;
    TEError const code = TEErrorFromStringSymbol(text.c_str(), &found);
    if (!found)
        throw ToolError("unknown error symbol \"" + text + "\"");
    return code;
}

Record DescribeCode(TEError code) {
    RString const message = TEErrorToRString(code, nullptr, nullptr);
    Record record;
    record.AddNumber("code", code)
        .AddText("symbol", TEErrorToStringSymbol(code))
        .AddText("comCode", HexCode(GetWinErrorCode(code)))
        .AddText("message", static_cast<char const*>(message));
    return record;
}

void PrintOne(ToolContext const& context, TEError code) {
    Record const record = DescribeCode(code);
    if (context.json)
        std::cout << record.ToJson() << '\n';
    else
        record.PrintText(std::cout);
}

void PrintAll(ToolContext const& context) {
    std::vector<std::string> json;
    std::vector<std::vector<std::string>> rows{{"CODE", "COM CODE", "SYMBOL", "MESSAGE"}};
    for (TEErrorInfo const* row = GetTEErrorTable(); row->symbol; ++row) {
        if (context.json) {
            json.push_back(DescribeCode(row->code).ToJson());
            continue;
        }
        RString const message = TEErrorToRString(row->code, nullptr, nullptr);
        rows.push_back({std::to_string(row->code), HexCode(row->comCode), row->symbol,
                        static_cast<char const*>(message)});
    }
    if (context.json)
        std::cout << JsonArray(json) << '\n';
    else
        PrintTable(std::cout, rows);
}

/// Takes a negative number such as "-17208", which the parser sees as an unknown option, as
/// the code; anything else left over is a usage error.
void TakeNegativeCode(CLI::App const& command, ErrorArguments& arguments) {
    std::vector<std::string> extras = command.remaining();
    // With extras allowed the parser hands back the "--" that ended the options as well.
    std::erase(extras, "--");
    if (extras.size() == 1 && arguments.code.empty() && LooksLikeNumber(extras[0]))
        arguments.code = extras[0];
    else if (!extras.empty())
        throw CLI::ExtrasError(extras);
}

void RunError(CLI::App const& command, ToolContext const& context, ErrorArguments& arguments) {
    TakeNegativeCode(command, arguments);
    if (arguments.all && !arguments.code.empty())
        throw CLI::ExcludesError("--all", "CODE");
    if (arguments.all)
        PrintAll(context);
    else if (!arguments.code.empty())
        PrintOne(context, ResolveCode(arguments.code));
    else
        throw CLI::RequiredError("CODE or --all");
}

} // namespace

void AddErrorCommand(CLI::App& app, ToolContext& context) {
    auto arguments = std::make_shared<ErrorArguments>();
    CLI::App* command =
        app.add_subcommand("error", "Show an error code's symbol, COM code and message");
    command->add_option("code", arguments->code,
                        "A TEError code (-17208) or its symbol (TE_FILE_NOT_FOUND)");
    command->add_flag("--all", arguments->all, "List the whole error table");
    AddJsonFlag(*command, context);
    command->allow_extras();
    command->callback([command, &context, arguments] { RunError(*command, context, *arguments); });
}

} // namespace tekit::tool

// tekit path check|split|collapse|abbreviate|longpath: the path rules applied to texts given on
// the command line.
//
//   tekit path check "C:\data\*.ini" --wildcards
//   tekit path split "\\srv\share\dir\report.final.ini"
//   tekit path abbreviate --max 20 "C:\first\a\b\c\file.txt"
#include "Commands.h"
#include "Output.h"

#include "tekit/errors/TEException.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"

#include <CLI/CLI.hpp>

#include <iostream>
#include <memory>

namespace tekit::tool {

namespace {

struct PathArguments {
    std::vector<std::string> paths;
    std::string path;
    bool wildcards = false;
    int maxChars = 0;
};

void Print(ToolContext const& context, Record const& record) {
    if (context.json)
        std::cout << record.ToJson() << '\n';
    else
        record.PrintText(std::cout);
}

std::string TextOf(DynamicString const& text) {
    return text.GetBufferReadPtr();
}

/// Each path's verdict; fails (status 1) when one of them is not valid.
void RunCheck(ToolContext const& context, PathArguments const& arguments) {
    std::vector<std::string> json;
    int invalid = 0;
    for (std::string const& text : arguments.paths) {
        DynamicPath const path(text.c_str());
        DynamicString message;
        bool const valid = path.IsValid(arguments.wildcards, &message);
        invalid += valid ? 0 : 1;
        if (context.json)
            json.push_back(Record()
                               .AddText("path", text)
                               .AddBool("valid", valid)
                               .AddText("message", TextOf(message))
                               .ToJson());
        else
            std::cout << text << ": " << (valid ? "valid" : TextOf(message)) << '\n';
    }
    if (context.json)
        std::cout << JsonArray(json) << '\n';
    if (invalid)
        throw ToolError(std::to_string(invalid) + " of " + std::to_string(arguments.paths.size()) +
                        " paths are not valid");
}

void RunSplit(ToolContext const& context, PathArguments const& arguments) {
    DynamicPath const path(arguments.path.c_str());
    DynamicString directory, fileName, baseName, extension;
    path.GetDirectoryPathName(directory);
    path.GetFileName(fileName);
    path.GetBaseName(baseName);
    path.GetExtension(extension);
    Record record;
    record.AddText("path", path.CStr());
    try {
        record.AddText("root", path.GetRootDir().CStr()).AddNumber("levels", path.GetNumLevels());
    } catch (TEException const&) {
        throw ToolError("\"" + arguments.path +
                        "\" has no levels: a UNC path names a machine and a share");
    }
    record.AddText("directory", TextOf(directory))
        .AddText("fileName", TextOf(fileName))
        .AddText("baseName", TextOf(baseName))
        .AddText("extension", TextOf(extension));
    Print(context, record);
}

void RunCollapse(ToolContext const& context, PathArguments const& arguments) {
    DynamicPath path(arguments.path.c_str());
    bool const resolved = path.CollapseDots();
    if (!context.json) {
        std::cout << path.CStr() << '\n';
        return;
    }
    Print(context, Record()
                       .AddText("path", arguments.path)
                       .AddText("collapsed", path.CStr())
                       .AddBool("resolved", resolved));
}

void RunAbbreviate(ToolContext const& context, PathArguments const& arguments) {
    DynamicString shortened;
    try {
        DynamicPath(arguments.path.c_str()).GetAbbreviatedName(arguments.maxChars, shortened);
    } catch (TEException const&) {
        throw ToolError("\"" + arguments.path +
                        "\" cannot be shortened: a UNC path names a machine and a share");
    }
    if (!context.json) {
        std::cout << shortened.GetBufferReadPtr() << '\n';
        return;
    }
    Print(context, Record()
                       .AddText("path", arguments.path)
                       .AddNumber("max", arguments.maxChars)
                       .AddText("abbreviated", TextOf(shortened)));
}

void RunLongPath(ToolContext const& context, PathArguments const& arguments) {
    DynamicString converted;
    PathBase::ConvertForLongPathCalls(DynamicString(arguments.path.c_str(), true), converted);
    if (!context.json) {
        std::cout << converted.GetBufferReadPtr() << '\n';
        return;
    }
    Print(context, Record().AddText("path", arguments.path).AddText("longPath", TextOf(converted)));
}

CLI::App* AddPathSubcommand(CLI::App& path, ToolContext& context, char const* name,
                            char const* description) {
    CLI::App* command = path.add_subcommand(name, description);
    AddJsonFlag(*command, context);
    return command;
}

} // namespace

void AddPathCommand(CLI::App& app, ToolContext& context) {
    auto arguments = std::make_shared<PathArguments>();
    CLI::App* path = app.add_subcommand("path", "Check, split and shorten Windows paths");
    path->require_subcommand(1);
    AddJsonFlag(*path, context);

    CLI::App* check = AddPathSubcommand(*path, context, "check",
                                        "Tell whether each path is valid, or why it is not");
    check->add_option("paths", arguments->paths, "Paths to check")->required();
    check->add_flag("--wildcards", arguments->wildcards, "Allow * and ? in the last component");
    check->callback([&context, arguments] { RunCheck(context, *arguments); });

    CLI::App* split = AddPathSubcommand(*path, context, "split",
                                        "Show a path's root, directory, file name and levels");
    split->add_option("path", arguments->path, "Path to split")->required();
    split->callback([&context, arguments] { RunSplit(context, *arguments); });

    CLI::App* collapse =
        AddPathSubcommand(*path, context, "collapse", "Remove . and resolve .. levels");
    collapse->add_option("path", arguments->path, "Path to collapse")->required();
    collapse->callback([&context, arguments] { RunCollapse(context, *arguments); });

    CLI::App* abbreviate =
        AddPathSubcommand(*path, context, "abbreviate", "Shorten a path with ... for display");
    abbreviate->add_option("--max", arguments->maxChars, "Most characters to show")->required();
    abbreviate->add_option("path", arguments->path, "Path to shorten")->required();
    abbreviate->callback([&context, arguments] { RunAbbreviate(context, *arguments); });

    CLI::App* longPath = AddPathSubcommand(*path, context, "longpath",
                                           "Show the form for the system's long-path calls");
    longPath->add_option("path", arguments->path, "Absolute path to convert")->required();
    longPath->callback([&context, arguments] { RunLongPath(context, *arguments); });
}

} // namespace tekit::tool

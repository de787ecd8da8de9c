// tekit: the command-line tool over the library.
//
//   tekit --version
//   tekit error TE_FILE_NOT_FOUND
//   tekit --json error --all
//   tekit path check 'C:\data\report.ini'
//   tekit demo
#include "Commands.h"

#include "tekit/errors/TEException.h"

#include <CLI/CLI.hpp>

#include <exception>
#include <iostream>

using namespace tekit::tool;

namespace tekit::tool {

void AddJsonFlag(CLI::App& command, ToolContext& context) {
    command.add_flag("--json", context.json, "Print JSON instead of text");
}

} // namespace tekit::tool

namespace {

int Fail(char const* what) {
    std::cerr << "tekit: " << what << '\n';
    return kFailure;
}

} // namespace

int main(int argc, char** argv) {
    ToolContext context;
    CLI::App app{"tekit: inspect and check the data of the Orvane foundation library", "tekit"};
    app.set_version_flag("--version", "tekit " TEKIT_VERSION_TEXT, "Print the version and exit");
    AddJsonFlag(app, context);
    app.require_subcommand(1);

    AddDemoCommand(app, context);
    AddErrorCommand(app, context);
    AddPathCommand(app, context);

    try {
        app.parse(argc, argv);
    } catch (CLI::ParseError const& e) {
        // Help and version end the parse with status 0; every other parse error is a usage
        // error, whatever CLI11's own code for it.
        return app.exit(e) == 0 ? kSuccess : kUsageError;
    } catch (ToolError const& e) {
        return Fail(e.what());
    } catch (tekit::TEException const& e) {
        return Fail(e.GetDescription());
    } catch (std::exception const& e) {
        return Fail(e.what());
    }
    return kSuccess;
}

// SPDX-License-Identifier: Apache-2.0
//
// orvane-unit: makes a simulated unit and runs orvane in it.
#include "kit/commands.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <iostream>
#include <string>

namespace {

constexpr int RAN = 0;
constexpr int WRONG_USE = 2;

/// One line, whatever words of the user stand in it.
int complain(std::string what) {
    std::replace(what.begin(), what.end(), '\n', ' ');
    std::cerr << "orvane-unit: " << what << '\n';
    return WRONG_USE;
}

/// Reads the command line and does what it says. What goes wrong, it throws.
int runCommandLine(int argc, char** argv) {
    using namespace orvane::kit;

    CLI::App app(
        "Makes a simulated unit - a folder that stands for the unit's \"/\" - and runs the "
        "unmodified orvane in it.",
        "orvane-unit");
    app.require_subcommand(1);

    NewCommand newCommand;
    CLI::App* const newApp = app.add_subcommand("new", "Make a unit");
    newApp->add_option("ROOT", newCommand.root, "The folder to make, absent or empty")->required();
    newApp->add_option("--from", newCommand.description,
                       "The unit's description in TOML; the built-in sample unit without it");

    RunCommand runCommand;
    CLI::App* const runApp = app.add_subcommand("run", "Run orvane in a unit");
    runApp->add_option("ROOT", runCommand.root, "The unit's folder")->required();
    runApp->add_option("--orvane", runCommand.binary,
                       "The binary to run; by default the one beside this program, else on PATH");
    runApp->add_flag("--show", runCommand.showsFiles, "Print each file that was written");
    runApp->add_option("ARGUMENTS", runCommand.arguments, "orvane's own options, after --");

    try {
        app.parse(argc, argv);
    } catch (const CLI::Success& help) {
        return app.exit(help);
    }
    if (newApp->parsed()) {
        newUnit(newCommand);
    } else {
        runUnit(runCommand);
    }
    return RAN;
}

} // namespace

int main(int argc, char** argv) {
    try {
        return runCommandLine(argc, argv);
    } catch (const std::exception& error) {
        return complain(error.what());
    }
}

// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/command_line.h"

#include "kit/host/kit_error.h"
#include "kit/host/text.h"
#include "orvane_unit/commands.h"
#include "orvane_unit/show/decoded_unit.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <cstddef>
#include <exception>
#include <functional>
#include <iostream>
#include <memory>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

namespace orvane::desk {

namespace {

/// A command's own part of the command line: its options, and what to do when it is chosen.
using Action = std::function<int()>;

constexpr char ROOT_HELP[] = "The unit's folder";

CLI::App* addCommand(CLI::App& app, const char* name, const char* what, const char* example) {
    CLI::App* const command = app.add_subcommand(name, what);
    command->footer(std::string("Example:\n  ") + example);
    return command;
}

Action addNew(CLI::App& app) {
    auto options = std::make_shared<NewCommand>();
    CLI::App* const command =
        addCommand(app, "new", "Make a unit", "orvane-unit new bench --from unit.toml");
    command->add_option("ROOT", options->root, "The folder to make, absent or empty")->required();
    command->add_option("--from", options->description,
                        "The unit's description in TOML; the built-in sample unit without it");
    return [options] { return runNew(*options); };
}

Action addDescribe(CLI::App& app) {
    auto options = std::make_shared<DescribeCommand>();
    CLI::App* const command =
        addCommand(app, "describe", "Print the description of a unit, which makes the same unit",
                   "orvane-unit describe bench > unit.toml");
    command->add_option("ROOT", options->root, ROOT_HELP)->required();
    return [options] { return runDescribe(*options); };
}

Action addSet(CLI::App& app) {
    auto options = std::make_shared<SetCommand>();
    CLI::App* const command =
        addCommand(app, "set", "Change single values of a unit",
                   "orvane-unit set bench param.139=12 serial=SN004217 tuning.3.qwaNRAtten=-40");
    command->add_option("ROOT", options->root, ROOT_HELP)->required();
    command
        ->add_option("KEY=VALUE", options->assignments,
                     "param.N, serial, slot.N, aux, tuning.BLOCK.FIELD, or tuning.BLOCK=FILE")
        ->required();
    return [options] { return runSet(*options); };
}

Action addShow(CLI::App& app) {
    auto options = std::make_shared<ShowCommand>();
    CLI::App* const command = addCommand(app, "show", "Print everything that a unit holds, decoded",
                                         "orvane-unit show bench --only versions");
    command->add_option("ROOT", options->root, "The unit's folder, or / for this system")
        ->required();
    command->add_option("--only", options->only, "params, records, tuning, versions or files")
        ->check(CLI::IsMember(partNames()));
    command->add_flag("--json", options->isJson, "Print JSON");
    return [options] { return runShow(*options); };
}

void addLetters(CLI::App& command) {
    command.add_flag("-a", "orvane's option -a; both, first -a, without either");
    command.add_flag("-i", "orvane's option -i");
}

/// -a and -i in the order and as often as they were given.
std::string givenLetters(const CLI::App& command) {
    std::string letters;
    for (const CLI::Option* const option : command.parse_order()) {
        const std::string name = option->get_name();
        if (name == "-a" || name == "-i") {
            letters += name[1];
        }
    }
    return letters;
}

Action addExplain(CLI::App& app) {
    auto options = std::make_shared<ExplainCommand>();
    CLI::App* const command =
        addCommand(app, "explain", "Say what orvane would write, and why, without running it",
                   "orvane-unit explain bench -a");
    command->add_option("ROOT", options->root, "The unit's folder, or / for this system")
        ->required();
    addLetters(*command);
    command->add_flag("--all", options->showsAll, "Print orvane's own text as well");
    CLI::Option* const json = command->add_flag("--json", options->isJson, "Print JSON");
    command->add_flag("--content", options->hasContent, "With --json: what each file would hold")
        ->needs(json);
    return [options, command] {
        options->letters = givenLetters(*command);
        return runExplain(*options);
    };
}

Action addRun(CLI::App& app) {
    auto options = std::make_shared<RunCommand>();
    CLI::App* const command =
        addCommand(app, "run", "Run the unmodified orvane in a unit, and show what it changed",
                   "orvane-unit run bench -- -a -i");
    command->add_option("ROOT", options->root, ROOT_HELP)->required();
    command->add_option("--orvane", options->binary,
                        "The binary to run; by default the one beside this program, else on PATH");
    command->add_flag("--json", options->isJson, "Print JSON");
    command->add_flag("--brief", options->isBrief, "Only name the files that changed");
    command->add_option("ARGUMENTS", options->arguments, "orvane's own options, after --");
    return [options] { return runRun(*options); };
}

Action addDiff(CLI::App& app) {
    auto options = std::make_shared<DiffCommand>();
    CLI::App* const command = addCommand(
        app, "diff", "Print the values that differ between two units, and the lines they move",
        "orvane-unit diff bench field");
    command->add_option("A", options->first, "A unit's folder, or /")->required();
    command->add_option("B", options->second, "Another unit's folder, or /")->required();
    addLetters(*command);
    command->add_flag("--json", options->isJson, "Print JSON");
    return [options, command] {
        options->letters = givenLetters(*command);
        return runDiff(*options);
    };
}

Action addImpact(CLI::App& app) {
    auto options = std::make_shared<ImpactCommand>();
    CLI::App* const command = addCommand(
        app, "impact", "Change every input in a copy of a unit, and say which output lines move",
        "orvane-unit impact bench param. slot.9");
    command->add_option("ROOT", options->root, "The unit's folder, or / for this system")
        ->required();
    command->add_option("KEY", options->prefixes,
                        "Only the inputs whose key begins so; all without any");
    command->add_flag("--json", options->isJson, "Print JSON");
    return [options] { return runImpact(*options); };
}

Action addCapture(CLI::App& app) {
    auto options = std::make_shared<CaptureCommand>();
    CLI::App* const command =
        addCommand(app, "capture", "Copy the inputs of a real unit into a new one",
                   "orvane-unit capture /mnt/field field --redact-serial");
    command->add_option("SOURCE", options->source, "/, or where an image of a unit is mounted")
        ->required();
    command->add_option("ROOT", options->root, "The folder to make, absent or empty")->required();
    command->add_flag("--redact-serial", options->redactsSerial, "Replace the serial by X");
    return [options] { return runCapture(*options); };
}

Action addCheck(CLI::App& app) {
    auto options = std::make_shared<CheckCommand>();
    CLI::App* const command =
        addCommand(app, "check", "Run orvane in every unit of a folder, and compare",
                   "orvane-unit check cases");
    command->add_option("FOLDER", options->folder, "A folder of folders with a unit.toml each")
        ->required();
    command->add_option("--orvane", options->binary,
                        "The binary to run; by default the one beside this program, else on PATH");
    command->add_flag("--update", options->updates, "Write what is found as the new expectations");
    command->add_flag("--json", options->isJson, "Print JSON");
    return [options] { return runCheck(*options); };
}

/// The first word must be a command or an option; the parser would only say that one is missing.
void checkCommand(const CLI::App& app, int argc, const char* const* argv) {
    const std::string word = argc > 1 ? argv[1] : "";
    if (word.empty() || word[0] == '-') {
        return;
    }
    std::string names;
    for (const CLI::App* const command :
         app.get_subcommands([](const CLI::App*) { return true; })) {
        if (command->get_name() == word) {
            return;
        }
        names += (names.empty() ? "" : ", ") + command->get_name();
    }
    throw kit::KitError("there is no command \"" + word + "\": it takes " + names);
}

int chooseAndRun(int argc, const char* const* argv) {
    CLI::App app("Makes simulated units - folders that stand for a unit's \"/\" -, explains what "
                 "orvane does in them and on real ones, and runs the unmodified orvane.",
                 "orvane-unit");
    app.require_subcommand(1);
    app.set_version_flag("--version", ORVANE_VERSION);
    app.footer("Exit status: 0 all as intended; 1 the answer is no: a fallback or a default stands "
               "in,\na difference, a failed check; 2 wrong use or bad input.");
    using Add = Action (*)(CLI::App&);
    constexpr Add COMMANDS[] = {addNew, addDescribe, addSet,    addShow,    addExplain,
                                addRun, addDiff,     addImpact, addCapture, addCheck};
    std::vector<Action> actions;
    for (const Add add : COMMANDS) {
        actions.push_back(add(app));
    }
    checkCommand(app, argc, argv);
    try {
        app.parse(argc, argv);
    } catch (const CLI::Success& help) {
        return app.exit(help);
    } catch (const CLI::ExtrasError& error) {
        const bool isRun = app.get_subcommand("run")->parsed();
        throw kit::KitError(std::string(error.what()) +
                            (isRun ? "; orvane's own options follow --" : ""));
    }
    const std::vector<const CLI::App*> commands =
        static_cast<const CLI::App&>(app).get_subcommands([](const CLI::App*) { return true; });
    for (std::size_t i = 0; i < commands.size(); ++i) {
        if (commands[i]->parsed()) {
            return actions.at(i)();
        }
    }
    return EXIT_BAD_INPUT; // not reached: one command is required
}

/// A complaint may have several lines, one for each thing that is wrong.
void complain(const std::string& what) {
    std::istringstream lines(what);
    for (std::string line; std::getline(lines, line);) {
        std::cerr << "orvane-unit: " << kit::printable(line) << '\n';
    }
}

} // namespace

int runCommandLine(int argc, const char* const* argv) {
    try {
        return chooseAndRun(argc, argv);
    } catch (const std::exception& error) {
        complain(error.what());
        return EXIT_BAD_INPUT;
    }
}

} // namespace orvane::desk

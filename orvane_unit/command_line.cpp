// SPDX-License-Identifier: Apache-2.0
//
// Each subcommand is a class: its options, and what it does with them. To add one, write a class
// and name it in chooseAndRun.
#include "orvane_unit/command_line.h"

#include "kit/description/description_text.h"
#include "kit/description/parse_description.h"
#include "kit/description/sample.h"
#include "kit/enter/captured_run.h"
#include "kit/enter/run_inside.h"
#include "kit/host/folder_lock.h"
#include "kit/host/kit_error.h"
#include "kit/host/text.h"
#include "kit/host/unfinished_file.h"
#include "kit/unit/capture_unit.h"
#include "kit/unit/describe_inputs.h"
#include "kit/unit/describe_unit.h"
#include "kit/unit/edit.h"
#include "kit/unit/make_unit.h"
#include "kit/unit/marker.h"
#include "kit/unit/unit_values.h"
#include "main/options.h"
#include "orvane_unit/check/case_check.h"
#include "orvane_unit/check/tmp_tree.h"
#include "orvane_unit/compare/impact.h"
#include "orvane_unit/compare/output_differences.h"
#include "orvane_unit/explain/explain.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/find_orvane.h"
#include "orvane_unit/page/page.h"
#include "orvane_unit/page/page_units.h"
#include "orvane_unit/report/check_text.h"
#include "orvane_unit/report/comparison_text.h"
#include "orvane_unit/report/decoded_unit_text.h"
#include "orvane_unit/report/explanation_text.h"
#include "orvane_unit/report/json.h"
#include "orvane_unit/report/run_text.h"
#include "orvane_unit/show/decoded_unit.h"
#include "orvane_unit/standard_streams.h"

#include <CLI/CLI.hpp>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <cstddef>
#include <exception>
#include <filesystem>
#include <iostream>
#include <memory>
#include <new>
#include <set>
#include <sstream>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace orvane::desk {

namespace {

/// Prints a complaint on one line.
void complain(const std::string& what) {
    std::cerr << "orvane-unit: " << kit::printable(what) << '\n';
}

/// What a program has printed, as lines: what follows it begins a new one.
std::string linesOf(const std::string& printed) {
    const bool isWithoutEnd = !printed.empty() && printed.back() != '\n';
    return kit::printableLines(printed) + (isWithoutEnd ? "\n" : "");
}

/// What is wrong with a value that must not be empty; empty if nothing is.
std::string emptyFault(const std::string& value) {
    return value.empty() ? "the value is empty" : "";
}

/// A subcommand. The parser fills its members with the options.
class Command {
public:
    Command(CLI::App& app, const char* name, const char* what, const char* example)
        : parser_(app.add_subcommand(name, what)) {
        parser_->footer(std::string("Example:\n  ") + example);
    }
    Command(const Command&) = delete;
    Command& operator=(const Command&) = delete;
    virtual ~Command() = default;

    bool isChosen() const { return parser_->parsed(); }

    /// Adds its report to `out`. Throws kit::KitError for wrong use or bad input.
    virtual ExitStatus run(std::ostream& out) const = 0;

protected:
    void addOption(const char* name, std::string& value, const char* what) {
        parser_->add_option(name, value, what)->check(emptyFault);
    }
    CLI::Option* addFlag(const char* name, bool& value, const char* what) {
        return parser_->add_flag(name, value, what)->disable_flag_override();
    }
    void addNeeded(const char* name, std::string& value, const char* what) {
        parser_->add_option(name, value, what)->required();
    }
    CLI::App& parser() { return *parser_; }
    const CLI::App& parser() const { return *parser_; }

private:
    CLI::App* parser_;
};

constexpr char MARKED_ROOT[] = "The unit's folder";
constexpr char ANY_ROOT[] = "The unit's folder, or / for this system";
constexpr char NEW_ROOT[] = "The folder to make, absent or empty";
constexpr char BINARY[] = "The binary to run; by default the one beside this program, else on PATH";
constexpr char JSON[] = "Print JSON";

class NewCommand : public Command {
public:
    explicit NewCommand(CLI::App& app)
        : Command(app, "new", "Make a unit", "orvane-unit new bench --from unit.toml") {
        addNeeded("ROOT", root_, NEW_ROOT);
        addOption("--from", description_,
                  "The unit's description in TOML; by default the built-in sample unit");
    }

    ExitStatus run(std::ostream& /*out*/) const override {
        kit::makeUnit(description_.empty()
                          ? kit::parseDescription(kit::sampleDescriptionText(), "sample")
                          : kit::readDescription(description_),
                      root_);
        return EXIT_AS_INTENDED;
    }

private:
    std::string root_;
    std::string description_;
};

class DescribeCommand : public Command {
public:
    explicit DescribeCommand(CLI::App& app)
        : Command(app, "describe", "Print the description of a unit, which makes the same unit",
                  "orvane-unit describe bench > unit.toml") {
        addNeeded("ROOT", root_, MARKED_ROOT);
    }

    ExitStatus run(std::ostream& out) const override {
        out << kit::descriptionText(kit::describeUnit(root_));
        return EXIT_AS_INTENDED;
    }

private:
    std::string root_;
};

class SetCommand : public Command {
public:
    explicit SetCommand(CLI::App& app)
        : Command(app, "set", "Change single values of a unit",
                  "orvane-unit set bench param.139=12 serial=SN004217 tuning.3.qwaNRAtten=-40") {
        addNeeded("ROOT", root_, MARKED_ROOT);
        parser()
            .add_option("KEY=VALUE", assignments_,
                        "param.N, serial, slot.N, aux, tuning.BLOCK.FIELD, or tuning.BLOCK=FILE")
            ->required();
    }

    ExitStatus run(std::ostream& /*out*/) const override {
        kit::setValues(root_, assignments_);
        return EXIT_AS_INTENDED;
    }

private:
    std::string root_;
    std::vector<std::string> assignments_;
};

class ShowCommand : public Command {
public:
    explicit ShowCommand(CLI::App& app)
        : Command(app, "show", "Print everything that a unit holds, decoded",
                  "orvane-unit show bench --only versions") {
        addNeeded("ROOT", root_, ANY_ROOT);
        parser()
            .add_option("--only", only_, "params, records, tuning, versions or files")
            ->check(CLI::IsMember(partNames()));
        addFlag("--json", isJson_, JSON);
    }

    ExitStatus run(std::ostream& out) const override {
        const DecodedUnit unit = decodeUnit(root_);
        if (isJson_) {
            out << decodedUnitJson(root_, unit, only_) << '\n';
        } else {
            printDecodedUnit(out, unit, only_);
        }
        return EXIT_AS_INTENDED;
    }

private:
    std::string root_;
    std::string only_;
    bool isJson_ = false;
};

/// The options of this program that stand for orvane's.
constexpr char AIRPLAY_FLAG[] = "-a";
constexpr char IAP_FLAG[] = "-i";

void addLetters(CLI::App& parser) {
    parser.add_flag(AIRPLAY_FLAG, "orvane's option -a; by default -a -i");
    parser.add_flag(IAP_FLAG, "orvane's option -i");
}

/// orvane's own options, in the order and as often as they were given.
std::string givenLetters(const CLI::App& parser) {
    std::string letters;
    for (const CLI::Option* const option : parser.parse_order()) {
        const std::string name = option->get_name();
        if (name == AIRPLAY_FLAG || name == IAP_FLAG) {
            letters += name[1];
        }
    }
    return letters.empty() ? std::string{AIRPLAY_OPTION, IAP_OPTION} : letters;
}

class ExplainCommand : public Command {
public:
    explicit ExplainCommand(CLI::App& app)
        : Command(app, "explain", "Say what orvane would write, and why, without running it",
                  "orvane-unit explain bench -a") {
        addNeeded("ROOT", root_, ANY_ROOT);
        addLetters(parser());
        addFlag("--all", showsAll_, "Print orvane's own text as well");
        CLI::Option* const json = addFlag("--json", isJson_, JSON);
        addFlag("--content", hasContent_, "With --json: what each file would hold")->needs(json);
    }

    ExitStatus run(std::ostream& out) const override {
        const std::string letters = givenLetters(parser());
        const Explanation explanation = explainUnit(root_, {"-" + letters});
        if (isJson_) {
            out << explanationJson(root_, letters, explanation, hasContent_) << '\n';
        } else {
            printExplanation(out, explanation, showsAll_);
        }
        return isIntended(explanation) ? EXIT_AS_INTENDED : EXIT_ANSWER_IS_NO;
    }

private:
    std::string root_;
    bool showsAll_ = false;
    bool isJson_ = false;
    bool hasContent_ = false;
};

class RunCommand : public Command {
public:
    explicit RunCommand(CLI::App& app)
        : Command(app, "run", "Run the unmodified orvane in a unit, and show what it changed",
                  "orvane-unit run bench -- -a -i") {
        addNeeded("ROOT", root_, MARKED_ROOT);
        addOption("--orvane", binary_, BINARY);
        addFlag("--json", isJson_, JSON);
        addFlag("--brief", isBrief_, "Only name the files that changed");
        parser().add_option("ARGUMENTS", arguments_, "orvane's own options, after --");
    }

    ExitStatus run(std::ostream& out) const override {
        kit::requireKitUnit(root_);
        const kit::FolderLock lock(root_);
        const TmpTree before = readTmp(root_);
        const kit::RunResult result = kit::runInside(root_, {findOrvane(binary_), arguments_});
        const TmpTree after = readTmp(root_);
        if (isJson_) {
            out << runJson(root_, result, before, after) << '\n';
        } else {
            out << linesOf(result.standardOutput);
            std::cerr << linesOf(result.standardError);
            printTmpChanges(out, before, after, isBrief_);
        }
        if (result.exitStatus != 0) {
            std::cerr << "orvane-unit: orvane ended with exit status " << result.exitStatus << '\n';
            return EXIT_ANSWER_IS_NO;
        }
        return EXIT_AS_INTENDED;
    }

private:
    std::string root_;
    std::string binary_;
    std::vector<std::string> arguments_;
    bool isBrief_ = false;
    bool isJson_ = false;
};

class DiffCommand : public Command {
public:
    explicit DiffCommand(CLI::App& app)
        : Command(app, "diff",
                  "Print the values that differ between two units, and the lines they change",
                  "orvane-unit diff bench field") {
        addNeeded("A", first_, "A unit's folder, or /");
        addNeeded("B", second_, "Another unit's folder, or /");
        addLetters(parser());
        addFlag("--json", isJson_, JSON);
    }

    ExitStatus run(std::ostream& out) const override {
        const std::string letters = givenLetters(parser());
        const std::vector<kit::ValueChange> changes =
            kit::differingValues(kit::unitValues(kit::describeInputs(first_)),
                                 kit::unitValues(kit::describeInputs(second_)));
        const std::vector<Consequence> found =
            consequences(changes, outputDifferences(explainUnit(first_, {"-" + letters}),
                                                    explainUnit(second_, {"-" + letters})));
        if (isJson_) {
            out << consequencesJson(first_, second_, found) << '\n';
        } else {
            printConsequences(out, found);
        }
        return found.empty() ? EXIT_AS_INTENDED : EXIT_ANSWER_IS_NO;
    }

private:
    std::string first_;
    std::string second_;
    bool isJson_ = false;
};

/// Draws a bar on standard error, if that is a terminal.
Progress terminalProgress() {
    if (::isatty(STDERR_FILENO) != 1) {
        return [](std::size_t /*done*/, std::size_t /*all*/) {};
    }
    return [](std::size_t done, std::size_t all) { printProgress(std::cerr, done, all); };
}

class ImpactCommand : public Command {
public:
    explicit ImpactCommand(CLI::App& app)
        : Command(app, "impact",
                  "Change every input in a copy of a unit, and say which output lines change",
                  "orvane-unit impact bench param. slot.9") {
        addNeeded("ROOT", root_, ANY_ROOT);
        parser()
            .add_option("KEY", prefixes_,
                        "Only the inputs whose key begins with this; by default all")
            ->check(emptyFault);
        addFlag("--json", isJson_, JSON);
    }

    ExitStatus run(std::ostream& out) const override {
        const std::vector<Impact> impacts = findImpacts(root_, prefixes_, terminalProgress());
        if (isJson_) {
            out << impactsJson(root_, impacts) << '\n';
        } else {
            printImpacts(out, impacts);
        }
        return EXIT_AS_INTENDED;
    }

private:
    std::string root_;
    std::vector<std::string> prefixes_;
    bool isJson_ = false;
};

class ReportCommand : public Command {
public:
    explicit ReportCommand(CLI::App& app)
        : Command(app, "report", "Write a page about units, for a browser",
                  "orvane-unit report bench -o bench.html") {
        parser()
            .add_option("ROOT", request_.roots,
                        "A unit's folder, /, a unit's description, or a folder of units or "
                        "descriptions")
            ->required()
            ->check(emptyFault);
        parser().add_option("-o", file_, "The page to write")->required()->check(emptyFault);
        addLetters(parser());
        addFlag("--redact-serial", request_.redactsSerial, "Replace the serials by X");
        addFlag("--impact", request_.hasImpacts, "Say also which inputs change which lines");
    }

    ExitStatus run(std::ostream& /*out*/) const override {
        requireReplaceable(file_);
        requireOutside(file_, unitFolders(request_.roots));
        const kit::UnfinishedFile file(file_);
        PageRequest request = request_;
        request.letters = givenLetters(parser());
        const std::vector<PageUnit> units = readPageUnits(request, terminalProgress());
        file.finish(pageText(units, request.letters, request.redactsSerial));
        return std::all_of(units.begin(), units.end(),
                           [](const PageUnit& unit) { return isIntended(unit.explanation); })
                   ? EXIT_AS_INTENDED
                   : EXIT_ANSWER_IS_NO;
    }

private:
    PageRequest request_;
    std::string file_;
};

class CaptureCommand : public Command {
public:
    explicit CaptureCommand(CLI::App& app)
        : Command(app, "capture", "Copy the inputs of a real unit into a new one",
                  "orvane-unit capture /mnt/field field --redact-serial") {
        addNeeded("SOURCE", source_, "/, or where an image of a unit is mounted");
        addNeeded("ROOT", root_, NEW_ROOT);
        addFlag("--redact-serial", redactsSerial_, "Replace the serial by X");
    }

    ExitStatus run(std::ostream& /*out*/) const override {
        kit::captureUnit(source_, root_, redactsSerial_);
        return EXIT_AS_INTENDED;
    }

private:
    std::string source_;
    std::string root_;
    bool redactsSerial_ = false;
};

/// Complains of the faults of all cases, of each once: most are about one file, but a full disk
/// strikes all. False when there is none.
bool complainOfFaults(const CheckReport& report) {
    std::set<std::string> faults;
    for (const CaseResult& result : report.cases) {
        if (!result.fault.empty() && faults.insert(result.fault).second) {
            complain(result.fault);
        }
    }
    return !faults.empty();
}

class CheckCommand : public Command {
public:
    explicit CheckCommand(CLI::App& app)
        : Command(app, "check", "Run orvane in every unit of a folder, and compare",
                  "orvane-unit check cases") {
        addNeeded("FOLDER", folder_, "A folder of folders with a unit.toml each");
        addOption("--orvane", binary_, BINARY);
        addFlag("--update", updates_, "Write what is found as the new expectations");
        addFlag("--json", isJson_, JSON);
    }

    ExitStatus run(std::ostream& out) const override {
        const CheckReport report = checkCases(folder_, findOrvane(binary_), updates_);
        if (isJson_) {
            out << checkJson(folder_, report) << '\n';
        } else {
            printCheck(out, report);
        }
        if (complainOfFaults(report)) {
            return EXIT_BAD_INPUT;
        }
        return std::all_of(report.cases.begin(), report.cases.end(),
                           [](const CaseResult& result) { return result.isAsExpected(); })
                   ? EXIT_AS_INTENDED
                   : EXIT_ANSWER_IS_NO;
    }

private:
    std::string folder_;
    std::string binary_;
    bool updates_ = false;
    bool isJson_ = false;
};

template <class... Commands>
std::vector<std::unique_ptr<Command>> addCommands(CLI::App& app) {
    std::vector<std::unique_ptr<Command>> commands;
    (commands.push_back(std::make_unique<Commands>(app)), ...);
    return commands;
}

std::string wordsInQuotes(const std::vector<std::string>& words) {
    std::string text;
    for (const std::string& word : words) {
        text += (text.empty() ? "" : ", ") + kit::inQuotes(word);
    }
    return text;
}

/// The command that the first word names, or `app` for an option that needs none. Throws for any
/// other word: the parser would only say that a command is missing.
const CLI::App& namedCommand(const CLI::App& app, int argc, const char* const* argv) {
    const std::string word = argc > 1 ? argv[1] : "";
    if (word == "-h" || word == "--help" || word == "--version") {
        return app;
    }
    std::string names;
    for (const CLI::App* const command :
         app.get_subcommands([](const CLI::App*) { return true; })) {
        if (command->get_name() == word) {
            return *command;
        }
        names += (names.empty() ? "" : ", ") + command->get_name();
    }
    throw kit::KitError("the first word must be one of " + names +
                        (argc > 1 ? ": not " + kit::inQuotes(word) : ""));
}

/// The words of a command, last first, as the parser takes them. An empty value after "=" becomes a
/// word: the parser would take the next one for it.
std::vector<std::string> wordsOf(const CLI::App& command, int argc, const char* const* argv) {
    std::vector<std::string> words;
    bool isForOrvane = false;
    for (int i = 1; i < argc; ++i) {
        const std::string word = argv[i];
        isForOrvane = isForOrvane || word == "--";
        const std::string name = word.substr(0, word.find('='));
        const CLI::Option* const option = command.get_option_no_throw(name);
        if (!isForOrvane && word == name + "=" && option != nullptr &&
            option->get_expected() != 0) {
            words.insert(words.end(), {name, ""});
        } else {
            words.push_back(word);
        }
    }
    std::reverse(words.begin(), words.end());
    return words;
}

/// Throws for the words that the chosen command does not take.
[[noreturn]] void failUnexpected(const CLI::App& app) {
    const CLI::App& command = *app.get_subcommands().front();
    throw kit::KitError(command.get_name() + " does not take " +
                        wordsInQuotes(command.remaining()) +
                        (command.get_name() == "run" ? "; orvane's own options follow --" : ""));
}

int chooseAndRun(int argc, const char* const* argv, std::ostream& out) {
    CLI::App app("Makes simulated units (folders that stand for a unit's \"/\"), explains what "
                 "orvane does in them and on real ones, and runs the unmodified orvane.",
                 "orvane-unit");
    app.require_subcommand(1);
    app.set_version_flag("--version", ORVANE_VERSION);
    app.footer("Exit status: 0 all as intended; 1 the answer is no: a fallback or a default stands "
               "in,\na difference, a failed check; 2 wrong use, bad input, or a report "
               "that can't be written.");
    const std::vector<std::unique_ptr<Command>> commands =
        addCommands<NewCommand, DescribeCommand, SetCommand, ShowCommand, ExplainCommand,
                    RunCommand, DiffCommand, ImpactCommand, ReportCommand, CaptureCommand,
                    CheckCommand>(app);
    try {
        app.parse(wordsOf(namedCommand(app, argc, argv), argc, argv));
    } catch (const CLI::Success& help) {
        return app.exit(help, out, out);
    } catch (const CLI::ExtrasError&) {
        failUnexpected(app);
    }
    // There is one: the parser requires it.
    const auto chosen = std::find_if(commands.begin(), commands.end(),
                                     [](const auto& command) { return command->isChosen(); });
    return (*chosen)->run(out);
}

} // namespace

int runCommandLine(int argc, const char* const* argv) {
    // A write past the limit for files then fails like any other.
    static_cast<void>(::signal(SIGXFSZ, SIG_IGN));
    try {
        prepareStandardStreams();
        // Whole: a report that ends in an error is not printed.
        std::ostringstream out;
        const int status = chooseAndRun(argc, argv, out);
        writeStandardOutput(out.str());
        // What the tool has printed there may be lost, and no line can say so.
        return std::cerr.good() ? status : EXIT_BAD_INPUT;
    } catch (const kit::KitError& error) {
        complain(error.text());
    } catch (const std::filesystem::filesystem_error& error) {
        complain(kit::systemError("cannot use ", error).text());
    } catch (const std::bad_alloc&) {
        std::cerr << "orvane-unit: out of memory\n"; // needs none itself
    } catch (const std::exception& error) {
        complain(error.what());
    }
    return EXIT_BAD_INPUT;
}

} // namespace orvane::desk

// SPDX-License-Identifier: Apache-2.0
//
// What orvane-unit does, once its command line is understood. Each command prints its report to
// standard output, as JSON where that is wanted (unit/json.h), and throws kit::KitError for wrong
// use or bad input.
#pragma once

#include <string>
#include <vector>

namespace orvane::desk {

/// The exit status of every command.
enum ExitStatus {
    EXIT_AS_INTENDED = 0,
    EXIT_ANSWER_IS_NO = 1, ///< a fallback or default stands in, a difference, a failed check
    EXIT_BAD_INPUT = 2,    ///< wrong use or bad input; a line on standard error says what
};

struct NewCommand {
    std::string root;
    std::string description; ///< a file; empty for the sample unit
};
int runNew(const NewCommand& command);

struct DescribeCommand {
    std::string root;
};
int runDescribe(const DescribeCommand& command);

struct SetCommand {
    std::string root;
    std::vector<std::string> assignments;
};
int runSet(const SetCommand& command);

struct ShowCommand {
    std::string root;
    std::string only; ///< one of partNames(); empty for all
    bool isJson = false;
};
int runShow(const ShowCommand& command);

struct ExplainCommand {
    std::string root;
    std::string letters; ///< the options, in their order; empty for "ai"
    bool showsAll = false;
    bool hasContent = false; ///< JSON only: with what the files hold
    bool isJson = false;
};
int runExplain(const ExplainCommand& command);

struct RunCommand {
    std::string root;
    std::string binary; ///< orvane's; empty for the one beside this program, else the one on PATH
    std::vector<std::string> arguments; ///< orvane's own
    bool isBrief = false;               ///< names the changed files only
    bool isJson = false;
};
int runRun(const RunCommand& command);

struct DiffCommand {
    std::string first;
    std::string second;
    std::string letters;
    bool isJson = false;
};
int runDiff(const DiffCommand& command);

struct ImpactCommand {
    std::string root;
    std::vector<std::string> prefixes; ///< of the keys to try; all without any
    bool isJson = false;
};
int runImpact(const ImpactCommand& command);

struct CaptureCommand {
    std::string source;
    std::string root;
    bool redactsSerial = false;
};
int runCapture(const CaptureCommand& command);

struct CheckCommand {
    std::string folder;
    std::string binary; ///< as in RunCommand
    bool updates = false;
    bool isJson = false;
};
int runCheck(const CheckCommand& command);

} // namespace orvane::desk

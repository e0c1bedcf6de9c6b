// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/commands.h"

#include "kit/description/description_text.h"
#include "kit/description/parse_description.h"
#include "kit/description/sample.h"
#include "kit/description/unit_description.h"
#include "kit/unit/capture_unit.h"
#include "kit/unit/describe_inputs.h"
#include "kit/unit/describe_unit.h"
#include "kit/unit/edit.h"
#include "kit/unit/make_unit.h"
#include "orvane_unit/compare/impact.h"
#include "orvane_unit/compare/output_differences.h"
#include "orvane_unit/compare/unit_values.h"
#include "orvane_unit/explain/explain.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/report/comparison_text.h"
#include "orvane_unit/report/decoded_unit_text.h"
#include "orvane_unit/report/explanation_text.h"
#include "orvane_unit/report/json.h"
#include "orvane_unit/show/decoded_unit.h"

#include <unistd.h>

#include <cstddef>
#include <iostream>

namespace orvane::desk {

namespace {

std::string lettersOrAll(const std::string& letters) {
    return letters.empty() ? "ai" : letters;
}

} // namespace

int runNew(const NewCommand& command) {
    const kit::UnitDescription unit =
        command.description.empty() ? kit::parseDescription(kit::sampleDescriptionText(), "sample")
                                    : kit::readDescription(command.description);
    kit::makeUnit(unit, command.root);
    return EXIT_AS_INTENDED;
}

int runDescribe(const DescribeCommand& command) {
    std::cout << kit::descriptionText(kit::describeUnit(command.root));
    return EXIT_AS_INTENDED;
}

int runSet(const SetCommand& command) {
    kit::setValues(command.root, command.assignments);
    return EXIT_AS_INTENDED;
}

int runCapture(const CaptureCommand& command) {
    kit::captureUnit(command.source, command.root, command.redactsSerial);
    return EXIT_AS_INTENDED;
}

int runShow(const ShowCommand& command) {
    const DecodedUnit unit = decodeUnit(command.root);
    if (command.isJson) {
        std::cout << decodedUnitJson(command.root, unit, command.only) << '\n';
    } else {
        printDecodedUnit(std::cout, unit, command.only);
    }
    return EXIT_AS_INTENDED;
}

int runExplain(const ExplainCommand& command) {
    const std::string letters = lettersOrAll(command.letters);
    const Explanation explanation = explainUnit(command.root, letters);
    if (command.isJson) {
        std::cout << explanationJson(command.root, letters, explanation, command.hasContent)
                  << '\n';
    } else {
        printExplanation(std::cout, explanation, command.showsAll);
    }
    return isIntended(explanation) ? EXIT_AS_INTENDED : EXIT_ANSWER_IS_NO;
}

int runDiff(const DiffCommand& command) {
    const std::string letters = lettersOrAll(command.letters);
    const std::vector<ValueChange> changes =
        differingValues(unitValues(kit::describeInputs(command.first)),
                        unitValues(kit::describeInputs(command.second)));
    const std::vector<OutputDifference> differences = outputDifferences(
        explainUnit(command.first, letters), explainUnit(command.second, letters));
    const std::vector<Consequence> found = consequences(changes, differences);
    if (command.isJson) {
        std::cout << consequencesJson(command.first, command.second, found) << '\n';
    } else {
        printConsequences(std::cout, found);
    }
    return found.empty() ? EXIT_AS_INTENDED : EXIT_ANSWER_IS_NO;
}

int runImpact(const ImpactCommand& command) {
    const bool showsProgress = ::isatty(STDERR_FILENO) == 1;
    const std::vector<Impact> impacts = findImpacts(
        command.root, command.prefixes, [showsProgress](std::size_t done, std::size_t all) {
            if (showsProgress) {
                printProgress(std::cerr, done, all);
            }
        });
    if (command.isJson) {
        std::cout << impactsJson(command.root, impacts) << '\n';
    } else {
        printImpacts(std::cout, impacts);
    }
    return EXIT_AS_INTENDED;
}

} // namespace orvane::desk

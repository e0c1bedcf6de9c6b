// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/explain/explain.h"

#include "kit/enter/root.h"
#include "orvane_unit/explain/explain_files.h"
#include "orvane_unit/explain/planned_files.h"

#include <vector>

namespace orvane::desk {

Explanation explain(const std::string& letters) {
    Explanation outputs;
    PlannedFiles files;
    for (const char letter : letters) {
        if (letter == 'a') {
            explainAirplay(files, outputs);
        } else if (letter == 'i') {
            explainIap(files, outputs);
        }
    }
    // Last, since a later output may be the same file by way of a link.
    for (Output& output : outputs) {
        output.left = files.look(output.path, output.content);
    }
    return outputs;
}

Explanation explainUnit(const std::filesystem::path& root, const std::string& letters) {
    const kit::EnteredRoot entered(root);
    return explain(letters);
}

} // namespace orvane::desk

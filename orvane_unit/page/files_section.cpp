// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/files_section.h"

#include "kit/description/value_key.h"
#include "kit/host/text.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/page/table_titles.h"
#include "orvane_unit/page/wide_table.h"
#include "orvane_unit/report/names.h"

namespace orvane::desk {

void addFiles(Markup& page, const std::vector<UnitFile>& files, const std::string& id) {
    const Element section(page, "section", {{"class", "files"}, {"id", id + "-files"}});
    page.add("h3", "Files before a run");
    const WideTable table(page, "paths");
    addTitles(page, {"path", "what it is for", "what is there"});
    const Element body(page, "tbody");
    for (const UnitFile& file : files) {
        const Element row(page, "tr",
                          {{"class", std::string("kind-") + nameOf(file.kind)},
                           {"data-key", keyText(kit::fileKey(file.path))}});
        page.add("th", file.path);
        page.add("td", file.role);
        page.add("td",
                 file.kind == PathKind::file ? kit::counted(file.size, "byte") : wordOf(file.kind));
    }
}

} // namespace orvane::desk

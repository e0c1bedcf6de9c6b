// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/versions_section.h"

#include "identity/inf_file.h"
#include "identity/software_version.h"
#include "kit/description/value_key.h"
#include "kit/host/text.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/explain/version_choice.h"
#include "orvane_unit/page/room.h"
#include "orvane_unit/page/table_titles.h"
#include "orvane_unit/page/wide_table.h"
#include "orvane_unit/report/phrases.h"

#include <array>
#include <cstddef>
#include <map>
#include <optional>
#include <utility>
#include <vector>

namespace orvane::desk {

namespace {

/// Says how many things are not shown, if any.
void addMore(Markup& page, std::size_t count, const char* thing) {
    if (count > 0) {
        const Element more(page, "p", {{"class", "more"}});
        page.addText(kit::counted(count, thing) + ": see ");
        page.add("code", "orvane-unit show --only versions");
    }
}

void addEntry(Markup& page, const std::string& name, const std::string& value,
              const std::string& key, Room& room) {
    const Element row(page, "tr", {{"data-key", key}});
    {
        const Element cell(page, "th");
        addText(page, name, room);
    }
    const Element cell(page, "td");
    addCode(page, value, room);
}

/// Adds what a file says, as much of it as there is room for.
void addFile(Markup& page, const VersionFiles& versions, std::size_t index, Room& room) {
    const VersionFile& file = versions.files[index];
    const bool isChosen = versions.chosen == index;
    const std::string key = keyText(kit::fileKey(file.path));
    const Element item(page, "li", {{"class", isChosen ? "version chosen" : "version"}});
    page.add("h4", {{"data-key", key}}, file.path);
    room.take(file.path);
    page.add("p", {{"class", "sign"}}, choiceText(versions, index));
    std::size_t shown = 0;
    {
        const WideTable table(page, "record");
        addTitles(page, {"key", "value"});
        const Element body(page, "tbody");
        for (const auto& [name, value] : file.record) {
            if (room.isUsedUp()) {
                break;
            }
            ++shown;
            addEntry(page, name, value, name == VERSION_KEY ? key : "", room);
        }
    }
    addMore(page, file.record.size() - shown, "more key");
}

/// Adds the files as far as there is room for them, and the chosen one in any case.
void addFiles(Markup& page, const VersionFiles& versions) {
    std::array<Room, 2> rooms; // of the others, and of the chosen one
    std::size_t left = 0;
    {
        const Element files(page, "ol", {{"class", "version-files"}});
        for (std::size_t i = 0; i < versions.files.size(); ++i) {
            Room& room = rooms.at(versions.chosen == i ? 1 : 0);
            if (room.isUsedUp()) {
                ++left;
            } else {
                addFile(page, versions, i, room);
            }
        }
    }
    addMore(page, left, "more file");
}

void addStep(Markup& page, const std::string& what, const std::string& result) {
    const Element step(page, "li");
    page.addText(what + ": ");
    page.add("code", briefly(result));
}

/// How the six digits come about, step by step.
void addSteps(Markup& page, const VersionFiles& versions) {
    const Element steps(page, "ol", {{"class", "steps"}});
    if (!versions.chosen) {
        addStep(page, "no file is chosen, so the digits are those for no version",
                DEFAULT_SOFTWARE_VERSION);
        return;
    }
    const Inf_Data& record = versions.files[*versions.chosen].record;
    const std::string text = versionText(record);
    addStep(page, std::string("the value of \"") + VERSION_KEY + "\"",
            infValue(record, VERSION_KEY));
    addStep(page, "without its prefix", text);
    if (isNoVersion(text)) {
        addStep(page, "no version, so the digits are those for none", formatVersion(text));
        return;
    }
    for (const std::string& component : versionComponents(text)) {
        addStep(page,
                "component " + kit::inQuotes(briefly(component)) + ", the number " +
                    std::to_string(componentNumber(component)) + ", in hexadecimal",
                formatVersionByte(component));
    }
    addStep(page, "one after the other", formatVersion(text));
}

} // namespace

void addVersions(Markup& page, const DecodedVersions& versions, const std::string& id) {
    const Element section(page, "section", {{"class", "versions"}, {"id", id + "-versions"}});
    page.add("h3", "Software version");
    {
        const Element summary(page, "p", {{"class", "summary"}});
        if (versions.version.empty()) {
            page.addText("There is no version; its digits are ");
        } else {
            page.addText("Version ");
            page.add("code", {{"class", "version-text"}}, briefly(versions.version));
            page.addText(", as digits ");
        }
        page.add("code", {{"class", "version-digits"}}, versions.digits);
    }
    if (!versions.found.hasFolder) {
        page.add("p", {{"class", "fallback"}},
                 reasonInfo(Reason::versionFolderMissing).sentence + ".");
    } else if (versions.found.files.empty()) {
        page.add("p", "There is no version description file.");
    } else {
        addFiles(page, versions.found);
    }
    addSteps(page, versions.found);
}

} // namespace orvane::desk

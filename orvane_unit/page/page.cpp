// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/page.h"

#include "kit/host/kit_error.h"
#include "kit/host/text.h"
#include "orvane_unit/page/files_section.h"
#include "orvane_unit/page/fleet_section.h"
#include "orvane_unit/page/image_section.h"
#include "orvane_unit/page/impact_section.h"
#include "orvane_unit/page/markup.h"
#include "orvane_unit/page/outputs_section.h"
#include "orvane_unit/page/own_files.h"
#include "orvane_unit/page/records_section.h"
#include "orvane_unit/page/tuning_section.h"
#include "orvane_unit/page/unit_id.h"
#include "orvane_unit/page/verdict_section.h"
#include "orvane_unit/page/versions_section.h"

#include <algorithm>
#include <cstddef>
#include <filesystem>
#include <fstream>
#include <system_error>
#include <utility>

namespace orvane::desk {

namespace {

/// Who made a page; a version follows.
constexpr char GENERATOR[] = "orvane-unit ";

std::string policy() {
    return std::string("default-src 'none'; script-src 'sha256-") + PAGE_SCRIPT.hash +
           "'; style-src 'sha256-" + PAGE_STYLE.hash + "'; base-uri 'none'; form-action 'none'";
}

void addHead(Markup& page, const std::string& title) {
    const Element head(page, "head");
    page.addVoid("meta", {{"charset", "utf-8"}});
    page.addVoid("meta", {{"http-equiv", "Content-Security-Policy"}, {"content", policy()}});
    page.addVoid("meta", {{"name", "viewport"}, {"content", "width=device-width"}});
    page.addVoid("meta", {{"name", "color-scheme"}, {"content", "light dark"}});
    page.addVoid("meta",
                 {{"name", "generator"}, {"content", std::string(GENERATOR) + ORVANE_VERSION}});
    page.add("title", title);
    page.addOwn("style", PAGE_STYLE.content);
}

void addUnit(Markup& page, const PageUnit& unit, const std::string& id) {
    const Element article(page, "article", {{"class", "unit"}, {"id", id}});
    page.add("h2", unit.name);
    addVerdict(page, unit.explanation, id);
    addOutputs(page, unit.explanation, id);
    addImage(page, unit.decoded.image, id);
    addRecords(page, unit.decoded.records, unit.decoded.tuning, id);
    addTuning(page, unit.decoded.tuning, id);
    addVersions(page, unit.decoded.versions, id);
    addFiles(page, unit.decoded.files, id);
    if (unit.impacts) {
        addImpacts(page, *unit.impacts, unit.explanation, id);
    }
}

/// "-a -i" for "ai".
std::string optionsText(const std::string& letters) {
    std::string text;
    for (const char letter : letters) {
        text += std::string(text.empty() ? "" : " ") + "-" + letter;
    }
    return text;
}

void addDocument(Markup& page, const std::vector<PageUnit>& units, const std::string& letters,
                 bool isRedacted) {
    const bool isFleet = units.size() > 1;
    const std::string name = isFleet ? kit::counted(units.size(), "unit") : units.front().name;
    const Element html(page, "html", {{"lang", "en"}});
    addHead(page, name + " - orvane-unit report");
    const Element body(page, "body");
    {
        const Element header(page, "header");
        page.add("h1", "What orvane " + optionsText(letters) + " writes, and why");
        page.add("p", "The unit as it was before a run. Nothing was written to it.");
        if (isRedacted) {
            page.add(
                "p", {{"class", "redacted"}},
                "Serials are replaced by X. The CRC, the size of the disk and the places on it are "
                "those of the copy without the serial. What was at the outputs before the run is "
                "left out.");
        }
    }
    {
        const Element main(page, "main");
        if (isFleet) {
            addFleet(page, units);
        }
        for (std::size_t i = 0; i < units.size(); ++i) {
            addUnit(page, units[i], unitId(i));
        }
    }
    page.add("footer", "Made by orvane-unit " ORVANE_VERSION ".");
    page.addOwn("script", PAGE_SCRIPT.content);
}

} // namespace

void requireReplaceable(const std::filesystem::path& file) {
    std::error_code ignored; // what can't be looked at can't be replaced either
    if (!std::filesystem::is_regular_file(file, ignored)) {
        return;
    }
    constexpr std::size_t MARK_WITHIN = 4096; // before the style, which is long
    std::string begin(MARK_WITHIN, '\0');
    std::ifstream stream(file, std::ios::binary);
    stream.read(begin.data(), static_cast<std::streamsize>(begin.size()));
    begin.resize(static_cast<std::size_t>(stream.gcount()));
    if (begin.rfind(Markup::BEGIN, 0) != 0 || begin.find(GENERATOR) == std::string::npos) {
        throw kit::KitError("", file, " is there and not a page: remove it first");
    }
}

void requireOutside(const std::filesystem::path& file,
                    const std::vector<std::filesystem::path>& units) {
    namespace fs = std::filesystem;
    const fs::path place = fs::weakly_canonical(fs::absolute(file));
    for (const fs::path& unit : units) {
        const fs::path root = fs::canonical(unit);
        if (root != root.root_path() &&
            std::mismatch(root.begin(), root.end(), place.begin(), place.end()).first ==
                root.end()) {
            throw kit::KitError("", file,
                                " is in the unit " + unit.string() + ": a page would change it");
        }
    }
}

std::string pageText(const std::vector<PageUnit>& units, const std::string& letters,
                     bool isRedacted) {
    Markup page;
    addDocument(page, units, letters, isRedacted);
    return page.document();
}

} // namespace orvane::desk

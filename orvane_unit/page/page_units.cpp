// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/page_units.h"

#include "kit/description/parse_description.h"
#include "kit/description/unit_description.h"
#include "kit/host/bytes.h"
#include "kit/host/host_file.h"
#include "kit/host/interruption.h"
#include "kit/host/kit_error.h"
#include "kit/host/scratch_folder.h"
#include "kit/host/tree_entries.h"
#include "kit/unit/describe_inputs.h"
#include "kit/unit/make_unit.h"
#include "kit/unit/marker.h"
#include "kit/unit/redact_serial.h"
#include "orvane_unit/explain/explain.h"
#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/version_choice.h"
#include "orvane_unit/show/decoded_unit.h"

#include <algorithm>
#include <cstddef>
#include <filesystem>
#include <optional>
#include <set>
#include <system_error>
#include <utility>

namespace orvane::desk {

namespace {

namespace fs = std::filesystem;

bool isFolder(const fs::path& path) {
    std::error_code ignored; // what can't be looked at is refused when it is read
    return fs::is_directory(path, ignored);
}

bool isDescription(const fs::path& path) {
    return path.extension() == ".toml" && !isFolder(path);
}

/// Whether nothing is there that a run opens.
bool isBare(const DecodedUnit& unit) {
    return std::all_of(unit.files.begin(), unit.files.end(),
                       [](const UnitFile& file) { return file.kind == PathKind::nothing; });
}

/// Whether the folder is a unit, made by the kit or not.
bool isUnit(const fs::path& root) {
    return kit::isRootDirectory(root) || kit::isKitUnit(root) || !isBare(decodeUnit(root));
}

/// The units and descriptions that the folder `root` holds, if it is no unit itself.
std::vector<fs::path> unitsIn(const fs::path& root) {
    std::vector<fs::path> units;
    if (isUnit(root)) {
        return units;
    }
    for (const fs::path& entry : kit::listFolder(root)) {
        if (isFolder(entry) ? isUnit(entry) : isDescription(entry)) {
            units.push_back(entry);
        }
    }
    std::sort(units.begin(), units.end());
    return units;
}

/// A unit or a description, and what the page calls it.
struct Source {
    std::string name;
    fs::path path;
};

std::vector<Source> sourcesOf(const std::vector<std::string>& roots) {
    std::vector<Source> sources;
    for (const std::string& root : roots) {
        const std::vector<fs::path> units =
            isFolder(root) ? unitsIn(root) : std::vector<fs::path>();
        for (const fs::path& unit : units) {
            // Their folder says nothing that tells them apart.
            sources.push_back({roots.size() == 1 ? unit.filename() : unit, unit});
        }
        if (units.empty()) {
            sources.push_back({root, root});
        }
    }
    return sources;
}

/// Throws for a folder in which nothing is that a run opens, unless the kit made it.
void requireUnit(const fs::path& root, const DecodedUnit& unit) {
    if (isBare(unit) && !kit::isKitUnit(root)) {
        throw kit::KitError("", root, " is not a unit: nothing that orvane opens is in it");
    }
}

/// Makes a copy of the unit at `root` without its serial, which it returns as redactSerial does.
/// None of `serials`, those of all units, may stand in the copy.
kit::Bytes copyWithoutSerial(const fs::path& root, const fs::path& copy,
                             const std::set<kit::Bytes>& serials) {
    kit::UnitInputs inputs = kit::readInputs(root);
    kit::Bytes own = kit::redactSerial(inputs);
    kit::makeUnit(kit::descriptionOf(std::move(inputs)), copy, [&serials](const fs::path& made) {
        for (const kit::Bytes& serial : serials) {
            kit::requireNowhere(serial, made);
        }
    });
    return own;
}

std::optional<std::string> chosenFile(const DecodedUnit& unit) {
    const VersionFiles& versions = unit.versions.found;
    return versions.chosen ? std::optional<std::string>(versions.files[*versions.chosen].path)
                           : std::nullopt;
}

/// The order of a folder's listing is the file system's, and decides between two applications.
void requireSameChoice(const DecodedUnit& original, const DecodedUnit& copy,
                       const kit::Bytes& serial) {
    const std::optional<std::string> chosen = chosenFile(original);
    if (chosen && kit::withoutSerial(serial, *chosen) != chosenFile(copy)) {
        throw kit::KitError("the serial can't be redacted: a copy of the unit lists the version "
                            "file of another application before " +
                            *chosen);
    }
}

/// Calls `use` with the root of a unit that is made from the description.
template <class Use>
auto inMadeRoot(const fs::path& file, const Use& use) {
    if (!fs::is_regular_file(file) && fs::exists(file)) {
        throw kit::KitError("", file, " is neither a unit nor a description");
    }
    const kit::UnitDescription description = kit::readDescription(file);
    const kit::ScratchFolder scratch;
    const fs::path root = scratch.path() / "unit";
    try {
        kit::makeUnit(description, root);
        return use(root);
    } catch (const kit::KitError& error) {
        throw error.moved(root, file);
    }
}

/// The error of a unit or description, which it names: many others may be on the page.
kit::KitError named(const kit::KitError& error, const fs::path& source) {
    const bool isNamed =
        error.isAbout(source) || error.text().compare(0, source.native().size(), source) == 0;
    return isNamed ? error : kit::KitError("", source, ": " + error.text());
}

/// Calls `use` with the root of the unit; that of a description is made for it.
template <class Use>
auto inRoot(const Source& source, const Use& use) {
    try {
        return isFolder(source.path) ? use(source.path) : inMadeRoot(source.path, use);
    } catch (const kit::KitError& error) {
        throw named(error, source.path);
    }
}

/// Reads units, and remembers what must not stand on the page.
class UnitReader {
public:
    UnitReader(const PageRequest& request, Progress progress)
        : request_(request), progress_(std::move(progress)) {}

    PageUnit read(const Source& source) {
        return inRoot(
            source, [this, &source](const fs::path& root) { return readRoot(source.name, root); });
    }

    /// Remembers the serial of the unit, of which no unit may show anything.
    void rememberSerial(const Source& source) {
        inRoot(source, [this](const fs::path& root) {
            kit::UnitInputs inputs = kit::readInputs(root);
            const kit::Bytes serial = kit::redactSerial(inputs);
            if (!serial.empty()) {
                serials_.insert(serial);
            }
            return true;
        });
    }

    std::string redacted(std::string name) const {
        for (const kit::Bytes& serial : serials_) {
            name = kit::withoutSerial(serial, name);
        }
        return name;
    }

private:
    PageUnit readRoot(const std::string& name, const fs::path& root) {
        DecodedUnit decoded = decodeUnit(root);
        requireUnit(root, decoded);
        if (!request_.redactsSerial) {
            return readInputs(name, root, std::move(decoded));
        }
        const kit::ScratchFolder scratch;
        const fs::path copy = scratch.path() / "unit";
        const kit::Bytes serial = copyWithoutSerial(root, copy, serials_);
        try {
            DecodedUnit decodedCopy = decodeUnit(copy);
            requireSameChoice(decoded, decodedCopy, serial);
            return readInputs(name, copy, std::move(decodedCopy));
        } catch (const kit::KitError& error) {
            throw error.moved(copy, root);
        }
    }

    PageUnit readInputs(const std::string& name, const fs::path& root, DecodedUnit decoded) const {
        PageUnit unit{name, explainUnit(root, {"-" + request_.letters}), std::move(decoded), {}};
        if (request_.hasImpacts) {
            unit.impacts = findImpacts(root, {}, progress_);
        }
        return unit;
    }

    const PageRequest& request_;
    Progress progress_;
    std::set<kit::Bytes> serials_; ///< of all units
};

} // namespace

std::vector<fs::path> unitFolders(const std::vector<std::string>& roots) {
    std::vector<fs::path> units;
    for (const Source& source : sourcesOf(roots)) {
        if (isFolder(source.path) && isUnit(source.path)) {
            units.push_back(source.path);
        }
    }
    return units;
}

std::vector<PageUnit> readPageUnits(const PageRequest& request, const Progress& progress) {
    const std::vector<Source> sources = sourcesOf(request.roots);
    const bool isOne = sources.size() == 1;
    UnitReader reader(
        request, isOne ? progress : [](std::size_t /*done*/, std::size_t /*all*/) {});
    for (const Source& source : sources) {
        kit::throwIfInterrupted();
        if (request.redactsSerial) {
            reader.rememberSerial(source);
        }
    }
    std::vector<PageUnit> units;
    for (const Source& source : sources) {
        kit::throwIfInterrupted();
        units.push_back(reader.read(source));
        if (!isOne) {
            progress(units.size(), sources.size());
        }
    }
    for (PageUnit& unit : units) {
        unit.name = reader.redacted(unit.name);
    }
    return units;
}

} // namespace orvane::desk

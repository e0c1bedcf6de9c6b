// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/names.h"

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <stdexcept>

namespace orvane::desk {

namespace {

template <class Value>
struct Named {
    Value value;
    const char* name;
};

constexpr Named<Outcome> OUTCOMES[] = {
    {Outcome::generated, "generated"}, {Outcome::stock, "stock"},        {Outcome::empty, "empty"},
    {Outcome::kept, "kept"},           {Outcome::notAsked, "not-asked"},
};

constexpr Named<CrcVerdict> CRC_VERDICTS[] = {
    {CrcVerdict::computed, "computed"},
    {CrcVerdict::blank, "blank"},
    {CrcVerdict::ambiguous, "ambiguous"},
    {CrcVerdict::unreadable, "unreadable"},
};

constexpr Named<CaseUpdate> CASE_UPDATES[] = {
    {CaseUpdate::done, "updated"},
    {CaseUpdate::needless, "unchanged"},
    {CaseUpdate::refused, "not-updated"},
};

constexpr Named<PathKind> PATH_KINDS[] = {
    {PathKind::nothing, "nothing"},
    {PathKind::file, "file"},
    {PathKind::folder, "folder"},
    {PathKind::other, "other"},
};

constexpr Named<PathKind> PATH_KIND_WORDS[] = {
    {PathKind::nothing, "missing"},
    {PathKind::file, "file"},
    {PathKind::folder, "folder"},
    {PathKind::other, "device"},
};

template <class Value, std::size_t COUNT>
const char* nameIn(const Named<Value> (&rows)[COUNT], Value value) {
    const auto* const row =
        std::find_if(std::begin(rows), std::end(rows),
                     [value](const Named<Value>& each) { return each.value == value; });
    if (row == std::end(rows)) {
        throw std::logic_error("error in orvane-unit: a value of an enumeration has no name");
    }
    return row->name;
}

} // namespace

const char* nameOf(Outcome outcome) {
    return nameIn(OUTCOMES, outcome);
}

const char* nameOf(CrcVerdict verdict) {
    return nameIn(CRC_VERDICTS, verdict);
}

const char* nameOf(CaseUpdate update) {
    return nameIn(CASE_UPDATES, update);
}

const char* nameOf(PathKind kind) {
    return nameIn(PATH_KINDS, kind);
}

const char* wordOf(PathKind kind) {
    return nameIn(PATH_KIND_WORDS, kind);
}

} // namespace orvane::desk

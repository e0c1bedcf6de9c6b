// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/json.h"

#include "config/param_catalogue.h"
#include "identity/inf_file.h"
#include "kit/description/value_key.h"
#include "kit/enter/captured_run.h"
#include "kit/host/text.h"
#include "kit/unit/unit_values.h"
#include "orvane_unit/compare/text_diff.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/explain/value_origins.h"
#include "orvane_unit/explain/version_choice.h"
#include "orvane_unit/report/names.h"
#include "orvane_unit/report/phrases.h"
#include "orvane_unit/report/place_text.h"
#include "tuning/dps_block.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <set>
#include <string_view>

namespace orvane::desk {

namespace {

using Json = nlohmann::ordered_json;

/// A character in a text of JSON: two escapes if it takes two units of UTF-16.
std::string escaped(char32_t character) {
    if (character <= 0xFFFFU) {
        return kit::unicodeEscape(character);
    }
    const char32_t above = character - 0x10000U;
    return kit::unicodeEscape(0xD800U + (above >> 10U)) +
           kit::unicodeEscape(0xDC00U + (above & 0x3FFU));
}

/// `json` on one line. Outside its texts everything is printable, so escapes stand only in them.
std::string lineOf(const Json& json) {
    std::string text;
    kit::forEachCharacter(json.dump(), [&text](char32_t character, std::string_view bytes) {
        text += kit::isPrintable(character) ? std::string(bytes) : escaped(character);
    });
    return text;
}

Json begin(const char* command) {
    return {{"format", JSON_FORMAT}, {"command", command}};
}

Json bytesJson(const std::string& bytes) {
    if (kit::isUtf8(bytes)) {
        return bytes;
    }
    std::string hex = kit::hexText(bytes);
    hex.erase(std::remove(hex.begin(), hex.end(), ' '), hex.end());
    return {{"hex", hex}};
}

Json bytesOrNull(const std::optional<std::string>& bytes) {
    return bytes ? bytesJson(*bytes) : Json();
}

Json textsJson(const std::vector<std::string>& texts) {
    Json json = Json::array();
    for (const std::string& text : texts) {
        json.push_back(bytesJson(text));
    }
    return json;
}

Json codesJson(const std::vector<Reason>& reasons) {
    Json codes = Json::array();
    for (const Reason reason : reasons) {
        codes.push_back(reasonInfo(reason).code);
    }
    return codes;
}

Json lineJson(const Line& line) {
    return {{"text", bytesJson(line.text)},
            {"reasons", codesJson(line.origin.reasons)},
            {"key", line.origin.key.isEmpty() ? Json() : bytesJson(keyText(line.origin.key))},
            {"detail", bytesJson(placeText(line.origin))}};
}

Json partJson(const DecodedImage& image) {
    Json rows = Json::array();
    for (const DecodedParam& param : image.params) {
        rows.push_back({{"number", param.row.number},
                        {"group", param.row.group},
                        {"offset", param.row.offset},
                        {"size", param.size},
                        {"raw", param.raw ? Json(*param.raw) : Json()},
                        {"default", param.row.defaultValue},
                        {"mask", param.row.mask},
                        {"code", param.code},
                        {"meaning", param.meaning.empty() ? Json() : bytesJson(param.meaning)}});
    }
    return {
        {"image", reasonInfo(image.found.reason).code}, {"size", image.found.size}, {"rows", rows}};
}

Json partJson(const DecodedRecords& records) {
    Json slots = Json::array();
    for (const DecodedSlot& slot : records.slots) {
        slots.push_back({{"number", slot.number},
                         {"size", slot.size},
                         {"offset", slot.offset},
                         {"bytes", slot.bytes ? Json(kit::hexText(*slot.bytes)) : Json()}});
    }
    const Reason disk = records.diskTrouble.value_or(Reason::fromRecord);
    return {{"disk", reasonInfo(disk).code},
            {"size", records.diskSize},
            {"slots", slots},
            {"aux", records.aux ? Json(kit::hexText(*records.aux)) : Json()},
            {"crc", records.crc},
            {"crcVerdict", nameOf(records.crcVerdict)}};
}

Json fieldJson(const DpsBlock& block, const DpsField& field) {
    if (field.kind == DpsKind::list) {
        Json values = Json::array();
        for (std::size_t element = 0; element < field.count; ++element) {
            values.push_back(decodeField(block, field, element));
        }
        return values;
    }
    const std::int32_t value = decodeField(block, field, 0);
    if (field.kind == DpsKind::number) {
        return value;
    }
    return {{"code", value}, {"word", fieldWord(field, value)}};
}

Json partJson(const TuningArea& tuning) {
    Json blocks = Json::array();
    for (const DpsBlock& block : tuning.blocks) {
        Json fields;
        for (const DpsField& field : DPS_LAYOUT) {
            fields[field.key] = fieldJson(block, field);
        }
        blocks.push_back(fields);
    }
    return {{"disk", reasonInfo(tuning.reason).code}, {"blocks", blocks}};
}

Json partJson(const DecodedVersions& versions) {
    Json files = Json::array();
    for (std::size_t i = 0; i < versions.found.files.size(); ++i) {
        const VersionFile& file = versions.found.files[i];
        Json record = Json::array();
        for (const auto& [key, value] : file.record) {
            record.push_back({{"key", bytesJson(key)}, {"value", bytesJson(value)}});
        }
        files.push_back({{"path", bytesJson(file.path)},
                         {"isApplication", file.isApplication},
                         {"isChosen", versions.found.chosen == i},
                         {"record", record}});
    }
    return {{"hasFolder", versions.found.hasFolder},
            {"files", files},
            {"version", bytesJson(versions.version)},
            {"digits", bytesJson(versions.digits)}};
}

Json partJson(const std::vector<UnitFile>& unitFiles) {
    Json files = Json::array();
    for (const UnitFile& file : unitFiles) {
        files.push_back({{"path", file.path},
                         {"role", file.role},
                         {"kind", nameOf(file.kind)},
                         {"size", file.size}});
    }
    return files;
}

Json differenceJson(const OutputDifference& output) {
    Json lines = Json::array();
    for (const DifferingLine& line : output.lines) {
        const bool isRemoved = line.line.kind == DiffLine::Kind::removed;
        lines.push_back({{"side", isRemoved ? "first" : "second"},
                         {"line", isRemoved ? line.line.before : line.line.after},
                         {"text", bytesJson(line.line.text)}});
    }
    return {{"path", output.path},
            {"first", nameOf(output.before)},
            {"second", nameOf(output.after)},
            {"lines", lines}};
}

} // namespace

std::string explanationJson(const std::string& root, const std::string& letters,
                            const Explanation& explanation, bool hasContent) {
    Json json = begin("explain");
    json["root"] = bytesJson(root);
    json["letters"] = letters;
    json["isIntended"] = isIntended(explanation);
    json["outputs"] = Json::array();
    for (const Output& output : explanation) {
        Json lines = Json::array();
        for (const Line& line : output.lines) {
            lines.push_back(lineJson(line));
        }
        Json entry = {{"path", output.path},
                      {"outcome", nameOf(output.outcome)},
                      {"isIntended", isIntended(output)},
                      {"reasons", codesJson(output.reasons)},
                      {"lines", lines},
                      {"left", nameOf(output.kindAfter)}};
        if (hasContent) {
            entry["content"] =
                output.kindAfter == PathKind::file ? bytesJson(output.contentAfter) : Json();
        }
        json["outputs"].push_back(entry);
    }
    return lineOf(json);
}

std::string decodedUnitJson(const std::string& root, const DecodedUnit& unit,
                            const std::string& only) {
    Json json = begin("show");
    json["root"] = bytesJson(root);
    forEachPart(unit, [&json, &only](const char* name, const auto& part) {
        if (only.empty() || only == name) {
            json[name] = partJson(part);
        }
    });
    return lineOf(json);
}

std::string runJson(const std::string& root, const kit::RunResult& result, const TmpTree& before,
                    const TmpTree& after) {
    Json json = begin("run");
    json["root"] = bytesJson(root);
    json["exitStatus"] = result.exitStatus;
    json["standardOutput"] = bytesJson(result.standardOutput);
    json["standardError"] = bytesJson(result.standardError);
    json["files"] = Json::array();
    for (const auto& [path, content] : after.entries) {
        json["files"].push_back({{"path", bytesJson(pathInTmp(path))},
                                 {"before", bytesOrNull(before.file(path))},
                                 {"after", bytesOrNull(content)}});
    }
    return lineOf(json);
}

std::string consequencesJson(const std::string& first, const std::string& second,
                             const std::vector<Consequence>& consequences) {
    Json json = begin("diff");
    json["first"] = bytesJson(first);
    json["second"] = bytesJson(second);
    json["values"] = Json::array();
    for (const Consequence& consequence : consequences) {
        Json outputs = Json::array();
        for (const OutputDifference& output : consequence.outputs) {
            outputs.push_back(differenceJson(output));
        }
        json["values"].push_back({{"key", bytesJson(keyText(consequence.change.key))},
                                  {"first", bytesJson(consequence.change.before)},
                                  {"second", bytesJson(consequence.change.after)},
                                  {"outputs", outputs}});
    }
    return lineOf(json);
}

std::string impactsJson(const std::string& root, const std::vector<Impact>& impacts) {
    Json json = begin("impact");
    json["root"] = bytesJson(root);
    json["inputs"] = Json::array();
    for (const Impact& impact : impacts) {
        Json lines = Json::array();
        for (const OutputLine& line : impact.lines) {
            lines.push_back(lineText(line));
        }
        json["inputs"].push_back({{"key", keyText(impact.key)},
                                  {"tried", impact.tried},
                                  {"moving", impact.changing},
                                  {"lines", lines}});
    }
    return lineOf(json);
}

std::string checkJson(const std::string& folder, const CheckReport& report) {
    Json json = begin("check");
    json["folder"] = bytesJson(folder);
    json["isUpdate"] = report.isUpdate;
    json["cases"] = Json::array();
    for (const CaseResult& result : report.cases) {
        json["cases"].push_back(
            {{"name", bytesJson(result.name)},
             {"differences", textsJson(result.differences)},
             {"surprises", textsJson(result.surprises)},
             {"fault", result.fault.empty() ? Json(nullptr) : bytesJson(result.fault)},
             {"update",
              result.update == CaseUpdate::none ? Json(nullptr) : Json(nameOf(result.update))},
             {"reasons", codesJson({result.reasons.begin(), result.reasons.end()})}});
    }
    json["unreached"] = report.unreached;
    return lineOf(json);
}

} // namespace orvane::desk

// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/image_section.h"

#include "config/param_catalogue.h"
#include "kit/description/value_key.h"
#include "kit/host/text.h"
#include "orvane_unit/explain/reasons.h"
#include "orvane_unit/explain/value_origins.h"
#include "orvane_unit/report/phrases.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

namespace orvane::desk {

namespace {

/// A byte of the image, which belongs to a parameter.
struct Cell {
    const DecodedParam& param;
    std::uint32_t index; ///< of the byte in the parameter
    bool isBehindEnd;
};

std::string groupName(std::uint32_t group) {
    return "group " + std::to_string(group);
}

std::string rawText(const DecodedParam& param) {
    return param.raw ? std::to_string(*param.raw) : "none";
}

/// Everything that is known of the parameter; only the byte's place for its second byte.
std::string detailOf(const Cell& cell) {
    const DecodedParam& param = cell.param;
    const std::string place = "byte " + std::to_string(param.row.offset + cell.index);
    if (cell.index > 0) {
        return place + ", the upper one of parameter " + std::to_string(param.row.number);
    }
    const std::string size = param.size == 1 ? "" : kit::counted(param.size, "byte") + ", ";
    const std::string text = place + ", " + size + groupName(param.row.group) + ", raw " +
                             rawText(param) + ", default " +
                             std::to_string(param.row.defaultValue) + ", mask " +
                             hexNumber(param.row.mask, 8);
    return param.meaning.empty() ? text : text + ": " + param.meaning;
}

void addCell(Markup& page, const Cell& cell, const std::string& bytes) {
    const DecodedParam& param = cell.param;
    const bool isRead = !param.meaning.empty();
    const std::size_t offset = param.row.offset + cell.index;
    const Element item(page, "li",
                       {{"class", "cell group-" + std::to_string(param.row.group) +
                                      (isRead ? " read" : "") + (cell.isBehindEnd ? " end" : "")},
                        {"data-key", keyText(kit::paramKey(param.row.number))}});
    page.add("b", std::to_string(param.row.number));
    page.add("code", offset < bytes.size() ? kit::hexText(bytes.substr(offset, 1)) : "--");
    if (isRead) {
        page.add("span", {{"class", "sign"}}, "read");
    }
    if (cell.isBehindEnd) {
        page.add("span", {{"class", "sign"}}, "past the end");
    }
    page.add("small", detailOf(cell));
}

void addLegend(Markup& page) {
    const Element legend(page, "ul", {{"class", "legend"}});
    for (std::uint32_t group = 0; group < NO_GROUP; ++group) {
        page.add("li", {{"class", "group-" + std::to_string(group)}}, groupName(group));
    }
    page.add("li", {{"class", "read"}}, "read by the tool");
    page.add("li", {{"class", "end"}}, "past the end of the image");
}

std::string summaryOf(const Image& image) {
    if (image.reason != Reason::fromImage) {
        return "There is no usable image: " + reasonInfo(image.reason).sentence +
               ". The tool's own defaults hold.";
    }
    std::string text = kit::counted(image.size, "byte");
    if (image.size < CONFIG_IMAGE_SIZE) {
        text += " of " + std::to_string(CONFIG_IMAGE_SIZE);
    } else if (image.size > CONFIG_IMAGE_SIZE) {
        text += ", of which " + std::to_string(image.size - CONFIG_IMAGE_SIZE) +
                " at the end belong to no parameter";
    }
    return text + ".";
}

} // namespace

void addImage(Markup& page, const DecodedImage& image, const std::string& id) {
    const Element section(page, "section", {{"class", "image"}, {"id", id + "-image"}});
    page.add("h3", "Configuration image");
    page.add("p", {{"data-key", keyText(kit::imageSizeKey())}}, summaryOf(image.found));
    addLegend(page);
    const Element cells(page, "ol", {{"class", "cells"}});
    for (const DecodedParam& param : image.params) {
        for (std::uint32_t index = 0; index < param.size; ++index) {
            addCell(page, {param, index, param.row.offset + index >= image.found.size},
                    image.found.bytes);
        }
    }
}

} // namespace orvane::desk

// SPDX-License-Identifier: Apache-2.0
//
// An assignment to a unit's value, read and checked as far as it can be without the unit.
#pragma once

#include "kit/host/bytes.h"
#include "kit/tuning/tuning_description.h"
#include "tuning/dps_block.h"

#include <cstdint>
#include <string>
#include <variant>
#include <vector>

namespace orvane::kit {

struct ParamEdit {
    std::uint16_t number;
    std::uint16_t value;
};

struct SlotEdit {
    std::uint32_t slot;
    Bytes bytes;
};

struct AuxEdit {
    Bytes bytes;
};

struct FieldEdit {
    std::uint32_t blockId;
    std::string key;
    TuningValue value;
};

/// All fields of a block; what no field reads does not count.
struct BlockEdit {
    std::uint32_t blockId;
    DpsBlock block;
};

struct Assignment {
    std::string text; ///< as it was given
    std::variant<ParamEdit, SlotEdit, AuxEdit, FieldEdit, BlockEdit> edit;
};

/// Reads an assignment, and the tuning file that it may name. Throws KitError as setValues does.
Assignment readAssignment(const std::string& text);

/// Throws KitError when two of the assignments set the same value.
void requireDistinct(const std::vector<Assignment>& assignments);

} // namespace orvane::kit

// SPDX-License-Identifier: Apache-2.0
//
// What the header of an ELF program says about how it must be started.
#pragma once

#include <cstdint>
#include <filesystem>
#include <string>

namespace orvane::kit {

struct ElfHeader {
    std::uint16_t machine = 0; ///< EM_... of <elf.h>
    std::string
        interpreter; ///< the loader of a dynamic program (PT_INTERP); empty for a static one
};

/// Reads the header of a little-endian program. Throws KitError for a file that can't be read or is
/// not one.
ElfHeader readElfHeader(const std::filesystem::path& file);

/// The machine that this program itself was built for.
std::uint16_t ownMachine();

} // namespace orvane::kit

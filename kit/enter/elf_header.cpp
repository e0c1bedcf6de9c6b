// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/elf_header.h"

#include "kit/host/kit_error.h"
#include "kit/host/tree_entries.h"

#include <elf.h>
#include <link.h>

#include <cstring>
#include <fstream>

// The linker's own symbol for the file header of the program being linked.
extern "C" __attribute__((visibility("hidden"))) const ElfW(Ehdr) ownHeader __asm__("__ehdr_start");

namespace orvane::kit {

namespace {

template <class T>
T readStruct(std::istream& in, std::uint64_t offset) {
    T value{};
    in.seekg(static_cast<std::streamoff>(offset));
    in.read(reinterpret_cast<char*>(&value), sizeof value);
    return value;
}

template <class FileHeader, class ProgramHeader>
ElfHeader readHeader(std::istream& in) {
    const auto fileHeader = readStruct<FileHeader>(in, 0);
    ElfHeader header;
    header.machine = fileHeader.e_machine;
    for (std::uint64_t row = 0; in && row < fileHeader.e_phnum; ++row) {
        const auto segment = readStruct<ProgramHeader>(
            in, fileHeader.e_phoff + row * std::uint64_t{fileHeader.e_phentsize});
        if (segment.p_type == PT_INTERP) {
            in.seekg(static_cast<std::streamoff>(segment.p_offset));
            std::getline(in, header.interpreter, '\0');
        }
    }
    return header;
}

} // namespace

ElfHeader readElfHeader(const std::filesystem::path& file) {
    const std::filesystem::file_type kind = kindBehind(file);
    if (kind != std::filesystem::file_type::regular &&
        kind != std::filesystem::file_type::not_found) {
        throw KitError("", file, " is " + nounOf(kind) + ", not a program");
    }
    std::ifstream in(file, std::ios::binary);
    if (!in) {
        throw systemError("cannot read ", file);
    }
    unsigned char identity[EI_NIDENT] = {};
    in.read(reinterpret_cast<char*>(identity), sizeof identity);
    const bool isElf =
        in && std::memcmp(identity, ELFMAG, SELFMAG) == 0 && identity[EI_DATA] == ELFDATA2LSB;
    ElfHeader header;
    if (isElf && identity[EI_CLASS] == ELFCLASS64) {
        header = readHeader<Elf64_Ehdr, Elf64_Phdr>(in);
    } else if (isElf && identity[EI_CLASS] == ELFCLASS32) {
        header = readHeader<Elf32_Ehdr, Elf32_Phdr>(in);
    } else {
        throw KitError("", file, " is not a little-endian ELF program");
    }
    if (!in) {
        throw KitError("", file, " is cut short");
    }
    return header;
}

std::uint16_t ownMachine() {
    return ownHeader.e_machine;
}

} // namespace orvane::kit

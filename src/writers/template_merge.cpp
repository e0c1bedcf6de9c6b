// SPDX-License-Identifier: Apache-2.0
#include "writers/template_merge.h"

namespace orvane {

namespace {

/// The buffer of every file that is copied. Streams that share it may be open together: each reads
/// only during its own copy.
std::array<char, INPUT_BUFFER_SIZE> InputBuffer; // NOLINT(*-non-const-global-variables)

/// The buffer comes first: a file stream accepts one only before its first use, if at all.
template <typename FileStream, std::size_t SIZE>
void open(FileStream& stream, std::array<char, SIZE>& buffer, const char* path) {
    stream.rdbuf()->pubsetbuf(buffer.data(), SIZE);
    stream.open(path);
}

} // namespace

MergeDecision decideMerge(const std::ios& templateFile, const std::ios& output) {
    if (templateFile.fail()) {
        return MergeDecision::templateFailed;
    }
    return output.fail() ? MergeDecision::outputFailed : MergeDecision::generate;
}

bool needsStockFile(MergeDecision decision) {
    return decision != MergeDecision::generate;
}

void copyBytes(std::istream& source, std::ostream& output) {
    output << source.rdbuf();
}

// A stream writes the buffer before it reads it. NOLINTNEXTLINE(*-member-init)
TemplateMerge::TemplateMerge(const AccessoryFile& accessoryFile) : file(accessoryFile) {
    open(output, outputBuffer, file.output);
    open(templateFile, InputBuffer, file.templateFile);
}

void TemplateMerge::close() {
    templateFile.close();
    output.close();
}

void TemplateMerge::finish(MergeDecision decision) {
    if (needsStockFile(decision)) {
        installStockFile(file);
    } else {
        close();
    }
}

void installStockFile(const AccessoryFile& file) {
    OutputBuffer outputBuffer;
    std::ifstream stock;
    std::ofstream output;
    open(stock, InputBuffer, file.stockFile);
    open(output, outputBuffer, file.output);
    copyBytes(stock, output);
    stock.close();
    output.close();
}

} // namespace orvane

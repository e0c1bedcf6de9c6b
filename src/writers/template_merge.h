// SPDX-License-Identifier: Apache-2.0
//
// Every accessory file is made in the same way: generated lines, then a template from the read-only
// partition, byte for byte; or, where that can't start, a complete stock file in place of it.
#pragma once

#include <array>
#include <cstddef>
#include <fstream>

namespace orvane {

/// The three paths of one accessory file.
struct AccessoryFile {
    const char* output;
    const char* templateFile;
    const char* stockFile;
};

/// Every output has its own buffer, small so that a run touches few pages: it holds a head, and a
/// large template bypasses it. Where the library uses it, opening the file needs no memory. What is
/// written never depends on it.
constexpr std::size_t OUTPUT_BUFFER_SIZE = 1024; // bytes
using OutputBuffer = std::array<char, OUTPUT_BUFFER_SIZE>;

/// All files that are copied share one buffer. Its size makes large templates fast: each read is
/// many whole pages, one byte less than the buffer, since libstdc++ keeps one back.
constexpr std::size_t INPUT_BUFFER_SIZE = 131073; // bytes

/// What becomes of an accessory file: it is generated, or replaced by its stock file because a
/// stream that it depends on has failed.
enum class MergeDecision {
    generate,
    templateFailed,
    outputFailed,
    iap2Failed, ///< the output of IAP2_FILE, on which IAP1_FILE depends
};

/// The decision for a file that needs both its streams. The template is tested first.
MergeDecision decideMerge(const std::ios& templateFile, const std::ios& output);

/// Whether the stock file replaces a file for which this was decided.
bool needsStockFile(MergeDecision decision);

/// Appends all bytes of `source` to `output`. A source without any (empty, absent or a folder)
/// leaves the output failed: what is written afterwards is dropped.
void copyBytes(std::istream& source, std::ostream& output);

/// The streams of one merge. A stream that could not be opened has failed, and what is written to
/// it is dropped.
struct TemplateMerge {
    /// Opens the output for writing (created, or truncated at once), then the template for reading.
    explicit TemplateMerge(const AccessoryFile& accessoryFile);

    /// Closes the template, then the output. A close that fails leaves its stream failed.
    void close();

    /// Ends the merge as decided: closes it, or puts the stock file in its place. The streams of a
    /// file that was not generated stay open.
    void finish(MergeDecision decision);

    AccessoryFile file;
    OutputBuffer outputBuffer;
    std::ofstream output;
    std::ifstream templateFile;
};

/// Puts the stock file in place of the output, through streams of its own. Nothing is checked: a
/// missing stock file leaves an empty output, an output that can't be opened stays as it is.
void installStockFile(const AccessoryFile& file);

} // namespace orvane

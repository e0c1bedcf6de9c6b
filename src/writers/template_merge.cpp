// SPDX-License-Identifier: Apache-2.0
#include "writers/template_merge.h"

namespace orvane {

namespace {

/// The buffer comes first: a file stream takes one only before its first use.
template <typename FileStream>
void open(FileStream& stream, StreamBuffer& buffer, const char* path) {
    stream.rdbuf()->pubsetbuf(buffer.data(), STREAM_BUFFER_SIZE);
    stream.open(path);
}

} // namespace

TemplateMerge::TemplateMerge(const AccessoryFile& file) {
    open(output, outputBuffer, file.output);
    open(templateFile, templateBuffer, file.templateFile);
}

void TemplateMerge::copyTemplate() {
    output << templateFile.rdbuf();
}

void TemplateMerge::close() {
    templateFile.close();
    output.close();
}

void installStockFile(const AccessoryFile& file) {
    StreamBuffer stockBuffer;
    StreamBuffer outputBuffer;
    std::ifstream stock;
    std::ofstream output;
    open(stock, stockBuffer, file.stockFile);
    open(output, outputBuffer, file.output);
    output << stock.rdbuf();
    stock.close();
    output.close();
}

} // namespace orvane

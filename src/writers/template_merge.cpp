// SPDX-License-Identifier: Apache-2.0
#include "writers/template_merge.h"

namespace orvane {

TemplateMerge::TemplateMerge(const AccessoryFile& file)
    : output(file.output), templateFile(file.templateFile) {}

void TemplateMerge::copyTemplate() {
    output << templateFile.rdbuf();
}

void TemplateMerge::close() {
    templateFile.close();
    output.close();
}

void installStockFile(const AccessoryFile& file) {
    std::ifstream stock(file.stockFile);
    std::ofstream output(file.output);
    output << stock.rdbuf();
    stock.close();
    output.close();
}

} // namespace orvane

// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/markup.h"

#include "kit/host/text.h"

namespace orvane::desk {

namespace {

/// Appends `bytes`. The quotes matter in attributes only, and do no harm elsewhere.
void appendEscaped(std::string& document, std::string_view bytes) {
    for (const char byte : kit::printable(bytes)) {
        switch (byte) {
        case '&':
            document += "&amp;";
            break;
        case '<':
            document += "&lt;";
            break;
        case '>':
            document += "&gt;";
            break;
        case '"':
            document += "&quot;";
            break;
        case '\'':
            document += "&#39;";
            break;
        default:
            document += byte;
        }
    }
}

} // namespace

void Markup::addText(std::string_view bytes) {
    isInBegin_ = false;
    appendEscaped(document_, bytes);
}

void Markup::add(const MarkupName& element, Attributes attributes, std::string_view text) {
    const Element whole(*this, element, attributes);
    addText(text);
}

void Markup::addVoid(const MarkupName& element, Attributes attributes) {
    begin(element, attributes);
    isInBegin_ = false;
}

void Markup::addShape(const MarkupName& element, Attributes attributes) {
    begin(element, attributes, "/>");
    isInBegin_ = false;
}

void Markup::addOwn(const MarkupName& element, const char* content) {
    const Element whole(*this, element);
    document_ += content;
}

void Markup::begin(const MarkupName& element, Attributes attributes, std::string_view close) {
    document_ += isInBegin_ ? "<" : "\n<";
    isInBegin_ = true;
    document_ += element.text();
    for (const Attribute& attribute : attributes) {
        if (attribute.value.empty()) {
            continue;
        }
        document_ += ' ';
        document_ += attribute.name.text();
        document_ += "=\"";
        appendEscaped(document_, attribute.value);
        document_ += '"';
    }
    document_ += close;
}

void Markup::end(const MarkupName& element) {
    isInBegin_ = false;
    document_ += "</";
    document_ += element.text();
    document_ += '>';
}

} // namespace orvane::desk

// SPDX-License-Identifier: Apache-2.0
//
// Writing HTML and SVG. Whatever bytes a text or an attribute has, they stay text: what is not
// printable is shown as an escape (kit/host/text.h), and nothing in them becomes markup.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace orvane::desk {

/// The name of an element or an attribute. Only a literal can be one.
class MarkupName {
public:
    template <std::size_t SIZE>
    constexpr MarkupName(const char (&literal)[SIZE]) : text_(literal, SIZE - 1) {}

    std::string_view text() const { return text_; }

private:
    std::string_view text_;
};

/// Left out if it has no value.
struct Attribute {
    MarkupName name;
    std::string value;
};

using Attributes = std::initializer_list<Attribute>;

/// A document, from its begin to its end. An element begins on a new line, unless it is the first
/// thing in another one.
class Markup {
public:
    /// How every document begins.
    static constexpr char BEGIN[] = "<!DOCTYPE html>";

    Markup() : document_(BEGIN) {}

    const std::string& document() const { return document_; }

    void addText(std::string_view bytes);

    /// An element that has only `text`.
    void add(const MarkupName& element, Attributes attributes, std::string_view text);
    void add(const MarkupName& element, std::string_view text) { add(element, {}, text); }

    /// An element that can have no content, such as `br`: it has no end.
    void addVoid(const MarkupName& element, Attributes attributes);

    /// A shape of a drawing, which has no content.
    void addShape(const MarkupName& element, Attributes attributes);

    /// A `style` or `script` of this program's own, whose content is not escaped.
    void addOwn(const MarkupName& element, const char* content);

private:
    friend class Element;
    void begin(const MarkupName& element, Attributes attributes, std::string_view close = ">");
    void end(const MarkupName& element);

    std::string document_;
    bool isInBegin_ = false; ///< whether an element has just begun, and has nothing yet
};

/// An element that is open while this exists: what is added meanwhile is its content.
class Element {
public:
    Element(Markup& markup, const MarkupName& name, Attributes attributes = {})
        : markup_(markup), name_(name) {
        markup_.begin(name_, attributes);
    }
    ~Element() { markup_.end(name_); }
    Element(const Element&) = delete;
    Element& operator=(const Element&) = delete;

private:
    Markup& markup_;
    MarkupName name_;
};

} // namespace orvane::desk

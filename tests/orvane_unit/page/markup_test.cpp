// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/page/markup.h"

#include <gtest/gtest.h>

#include <string>

namespace orvane::test {

namespace {

using desk::Element;
using desk::Markup;

constexpr char DOCTYPE[] = "<!DOCTYPE html>";

std::string textOf(std::string_view bytes) {
    Markup page;
    page.addText(bytes);
    return page.document().substr(sizeof DOCTYPE - 1);
}

std::string attributeOf(const std::string& bytes) {
    Markup page;
    page.addVoid("br", {{"title", bytes}});
    return page.document().substr(sizeof DOCTYPE - 1);
}

TEST(MarkupTest, ElementsEndInTheOrderInWhichTheyMust) {
    Markup page;
    {
        const Element table(page, "table", {{"class", "a"}, {"id", "b"}});
        {
            const Element row(page, "tr");
            page.add("td", "one");
            page.add("td", {{"class", "c"}}, "two");
        }
        page.addVoid("br", {});
    }
    EXPECT_EQ(page.document(), std::string(DOCTYPE) +
                                   "\n<table class=\"a\" id=\"b\"><tr><td>one</td>"
                                   "\n<td class=\"c\">two</td></tr>\n<br></table>");
}

TEST(MarkupTest, ShapeEndsItself) {
    Markup page;
    {
        const Element group(page, "g");
        page.addShape("rect", {{"width", "1"}});
        page.addShape("path", {});
    }
    EXPECT_EQ(page.document(), std::string(DOCTYPE) + "\n<g><rect width=\"1\"/>\n<path/></g>");
}

TEST(MarkupTest, OwnContentStaysAsItIs) {
    Markup page;
    page.addOwn("style", "a > b { content: \"&\" }\n");
    EXPECT_EQ(page.document(),
              std::string(DOCTYPE) + "\n<style>a > b { content: \"&\" }\n</style>");
}

TEST(MarkupTest, NothingInATextBecomesMarkup) {
    EXPECT_EQ(textOf("</script><img src=x onerror='alert(1)'>"),
              "&lt;/script&gt;&lt;img src=x onerror=&#39;alert(1)&#39;&gt;");
    EXPECT_EQ(textOf("<!-- & ]]> &lt;"), "&lt;!-- &amp; ]]&gt; &amp;lt;");
}

TEST(MarkupTest, NothingInAnAttributeEndsIt) {
    EXPECT_EQ(attributeOf("\" onclick=\"alert(1)"),
              "\n<br title=\"&quot; onclick=&quot;alert(1)\">");
    EXPECT_EQ(attributeOf("'><b>"), "\n<br title=\"&#39;&gt;&lt;b&gt;\">");
    EXPECT_EQ(attributeOf("a\nb"), "\n<br title=\"a\\nb\">");
}

TEST(MarkupTest, AttributeWithoutAValueIsLeftOut) {
    EXPECT_EQ(attributeOf(""), "\n<br>");
}

TEST(MarkupTest, WhatIsNotPrintableIsAnEscape) {
    EXPECT_EQ(textOf(std::string("\0\t\r\n\x1b[31m\x7f\\", 11)),
              "\\x00\\x09\\x0d\\n\\x1b[31m\\x7f\\\\");
    EXPECT_EQ(textOf("abc\u202Edef\u202C"),
              "abc\\xe2\\x80\\xaedef\\xe2\\x80\\xac"); // reverses what follows
    EXPECT_EQ(textOf("\u2066a\u2069\u200b"),
              "\\xe2\\x81\\xa6a\\xe2\\x81\\xa9\\xe2\\x80\\x8b"); // isolates; no width
    EXPECT_EQ(textOf("\xff\xc3("), "\\xff\\xc3(");
    EXPECT_EQ(textOf("\xc0\xbcscript\xc0\xbe"), "\\xc0\\xbcscript\\xc0\\xbe"); // overlong < and >
    EXPECT_EQ(textOf("\xe2\x82"), "\\xe2\\x82");
}

TEST(MarkupTest, PrintableTextStays) {
    EXPECT_EQ(textOf("Größe \u20ac \U0001F697"), "Größe \u20ac \U0001F697");
}

TEST(MarkupTest, NoByteIsMarkupAlone) {
    for (int value = 0; value < 256; ++value) {
        const std::string text = textOf(std::string(1, static_cast<char>(value)));
        EXPECT_FALSE(text.empty()) << value;
        EXPECT_EQ(text.find_first_of("<>\"'"), std::string::npos) << value;
        EXPECT_EQ(text.find_first_of(std::string("\0\r\n\x1b", 4)), std::string::npos) << value;
    }
}

} // namespace

} // namespace orvane::test

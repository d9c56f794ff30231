#include <cstdint>
#include <limits>

#include "expectThrows.h"
#include "xmlEx.h"
#include "xmlTesting.h"
#include "xmlTopElement.h"
#include "xmlWriter.h"

namespace Orv {

namespace {

/// An element of the application's own, which does as it is told.
class OwnElement : public XmlBaseElement {
public:
    using Stream = std::function<void(XmlWriter&)>;

    explicit OwnElement(
        Stream attributes, Stream children = [](XmlWriter&) {})
        : _attributes(std::move(attributes)), _children(std::move(children)) {}

    LiString getName() const override { return "own"; }
    void streamAttributes(XmlWriter& writer) const override { _attributes(writer); }
    void streamChildren(XmlWriter& writer) const override { _children(writer); }

private:
    Stream _attributes;
    Stream _children;
};

std::string textOf(const LiString& xml) {
    return std::string(xml.getText());
}

TEST(XmlWriter, writesByteForByte) {
    const struct {
        int line;
        std::function<void(XmlWriter&)> write;
        const char* expected;
    } rows[] = {
        {__LINE__,
         [](XmlWriter& writer) {
             writer.startElement("a");
             writer.endElement("a");
         },
         "\n<a>\n</a>\n"},
        {__LINE__,
         [](XmlWriter& writer) {
             writer.startElement("a");
             writer.writeAttribute("x", "1");
             writer.writeAttribute("y", "\"&'<>z");
             writer.writeAttribute("z", LiString());
             writer.endElement("a");
         },
         "\n<a\n    x=\"1\"\n    y=\"&quot;&amp;&apos;&lt;&gt;z\"\n    z=\"\">\n</a>\n"},
        {__LINE__,
         [](XmlWriter& writer) {
             writer.startElement("a");
             writer.startElement("b");
             writer.writeAttribute("x", 1);
             writer.startElement("c");
             writer.endElement("c");
             writer.endElement("b");
             writer.startElement("d");
             writer.endElement("d");
             writer.endElement("a");
         },
         "\n<a>\n"
         "\n    <b\n        x=\"1\">\n"
         "\n        <c>\n        </c>\n"
         "    </b>\n"
         "\n    <d>\n    </d>\n"
         "</a>\n"},
        {__LINE__, [](XmlWriter& writer) { writer.startElement("unfinished"); }, "\n<unfinished"},
        {__LINE__,  // names are not compared
         [](XmlWriter& writer) {
             writer.startElement("<");
             writer.endElement("");
         },
         "\n<<>\n</>\n"},
    };
    XmlWriter writer;
    for (const auto& row : rows) {
        row.write(writer);
        EXPECT_EQ(textOf(writer.getXml()), row.expected) << "line " << row.line;
        writer.reset();
    }
}

template <class T>
std::string attributeOf(T value) {
    XmlWriter writer;
    writer.startElement("");
    writer.writeAttribute("", value);
    XmlTopElement element("");
    element.setAttribute("", value);
    const std::string text = textOf(writer.getXml());
    EXPECT_EQ(textOf(XmlWriter().toXml(element)), text + ">\n</>\n");
    return text;
}

template <class T>
class XmlWriterInteger : public testing::Test {};

using Integers =
    testing::Types<std::int8_t, std::uint8_t, std::int16_t, std::uint16_t, std::int32_t,
                   std::uint32_t, std::int64_t, std::uint64_t, long, unsigned long, char>;
TYPED_TEST_SUITE(XmlWriterInteger, Integers);

TYPED_TEST(XmlWriterInteger, isWrittenInDecimal) {
    using Limits = std::numeric_limits<TypeParam>;
    for (const TypeParam value : {Limits::min(), TypeParam(0), TypeParam(65), Limits::max()}) {
        EXPECT_EQ(attributeOf(value), "\n<\n    =\"" + std::to_string(value) + "\"");
    }
}

TEST(XmlWriter, nestsBeyondEveryWordOfBits) {
    constexpr int DEPTH = 1000;
    XmlWriter writer;
    std::string expected;
    for (int i = 0; i < DEPTH; ++i) {
        writer.startElement("e");
        if (i % 3 == 0) writer.writeAttribute("i", i);
        const std::string indentation(4 * static_cast<std::size_t>(i), ' ');
        expected += "\n" + indentation + "<e";
        if (i % 3 == 0) expected += "\n    " + indentation + "i=\"" + std::to_string(i) + "\"";
        expected += ">\n";
    }
    for (int i = DEPTH; i-- > 0;) {
        writer.endElement("e");
        expected += std::string(4 * static_cast<std::size_t>(i), ' ') + "</e>\n";
    }
    EXPECT_EQ(textOf(writer.getXml()), expected);
}

TEST(XmlWriter, writesTreesAndDocumentsAndStartsAgain) {
    XmlTopElement top("top");
    top.setAttribute("b", "1");
    top.setAttribute("a", "<");
    top.setAttribute("b", 2);
    XmlTopElement& first = top.addChild("first");
    first.addChild("inner").setAttribute("x", true);
    top.addChild(ObjPtr<XmlBaseElement>(
        new OwnElement([](XmlWriter& writer) { writer.writeAttribute("y", -1); },
                       [](XmlWriter& writer) { XmlTopElement("made").streamToOutput(writer); })));
    top.addChild("last");
    const std::string element =
        "\n<top\n    b=\"2\"\n    a=\"&lt;\">\n"
        "\n    <first>\n"
        "\n        <inner\n            x=\"1\">\n        </inner>\n"
        "    </first>\n"
        "\n    <own\n        y=\"-1\">\n"
        "\n        <made>\n        </made>\n"
        "    </own>\n"
        "\n    <last>\n    </last>\n"
        "</top>\n";
    const std::string declaration = "<?xml version='1.0'?>\n\n";
    XmlWriter writer;
    for (int i = 0; i < 2; ++i) {
        EXPECT_EQ(textOf(writer.toXml(top)), element);
        EXPECT_EQ(textOf(writer.toXmlDocument(top)), declaration + element);
        EXPECT_EQ(textOf(writer.toXmlDocument(top, "movie")),
                  declaration + "<!DOCTYPE movie>\n" + element);
        EXPECT_EQ(textOf(writer.toXmlDocument(top, "")), declaration + element);
        EXPECT_EQ(textOf(writer.getXml()), "");
    }
}

TEST(XmlWriter, refusesAttributesOutsideAStartTag) {
    XmlWriter writer;
    const auto expectRefusal = [&](int line) {
        const testing::ScopedTrace where(__FILE__, line, "here");
        const LiString before = writer.getXml();
        const char* const reason = "Attribute \"x\" comes after the content of its element.";
        expectThrows<XmlEx::ExSyntaxError>(reason, [&] { writer.writeAttribute("x", "1"); });
        expectThrows<XmlEx::ExSyntaxError>(reason, [&] { writer.writeAttribute("x", 1); });
        EXPECT_EQ(writer.getXml(), before);
    };
    expectRefusal(__LINE__);
    writer.startElement("a");
    writer.startElement("b");
    writer.endElement("b");
    expectRefusal(__LINE__);
    writer.endElement("a");
    expectRefusal(__LINE__);
}

TEST(XmlWriter, anEndWithoutItsStartAsserts) {
    XmlWriter writer;
    const auto end = [&] { writer.endElement("a"); };
    expectAsserts("_state.depth > 0", end);
    writer.startElement("a");
    end();
    expectAsserts("_state.depth > 0", end);
    EXPECT_EQ(textOf(writer.getXml()), "\n<a>\n</a>\n");
}

TEST(XmlWriter, anElementThatFailsLeavesTheTextAsItWas) {
    const OwnElement::Stream nothing = [](XmlWriter&) {};
    const OwnElement::Stream throws = [](XmlWriter&) { throw std::out_of_range("no value"); };
    const OwnElement::Stream startsTooMuch = [](XmlWriter& writer) { writer.startElement("x"); };
    const OwnElement::Stream endsTooMuch = [](XmlWriter& writer) { writer.endElement("own"); };
    const OwnElement attributeThrows(throws);
    const OwnElement childThrows(nothing, [&](XmlWriter& writer) {
        writer.startElement("x");
        writer.writeAttribute("y", 1);
        throws(writer);
    });
    XmlWriter writer;
    writer.startElement("before");
    EXPECT_THROW(writer.toXml(attributeThrows), std::out_of_range);
    EXPECT_THROW(writer.toXml(childThrows), std::out_of_range);
    expectAsserts("_state.depth == depth",
                  [&] { writer.toXml(OwnElement(nothing, startsTooMuch)); });
    expectAsserts("_state.depth == depth", [&] { writer.toXml(OwnElement(nothing, endsTooMuch)); });
    EXPECT_EQ(textOf(writer.getXml()), "\n<before");
    writer.writeAttribute("still", "open");
    EXPECT_EQ(textOf(writer.toXml(XmlTopElement("child"))),
              "\n<before\n    still=\"open\">\n\n    <child>\n    </child>\n");

    // Out of order altogether: what the outer call has written goes to the inner one.
    XmlTopElement top("top");
    top.addChild(ObjPtr<XmlBaseElement>(
        new OwnElement(nothing, [](XmlWriter& inner) { inner.toXml(XmlTopElement("inner")); })));
    expectAsserts("_state.depth > 0", [&] { writer.toXmlDocument(top); });
    EXPECT_EQ(textOf(writer.getXml()), "");
}

TEST(XmlTopElement, aTreeOfAnyDepthIsDestroyed) {
    XmlTopElement top("top");
    XmlTopElement* innermost = &top;
    for (int i = 0; i < 200000; ++i) {
        innermost->addChild("sibling");
        innermost = &innermost->addChild("e");
    }
}

TEST(XmlTopElement, destroysEveryChildOnceAndTakesNoNull) {
    const auto alive = std::make_shared<int>();
    {
        XmlTopElement top("top");
        XmlTopElement& inner = top.addChild("inner");
        for (XmlTopElement* parent : {&top, &inner, &top}) {
            parent->addChild(ObjPtr<XmlBaseElement>(new OwnElement([alive](XmlWriter&) {})));
        }
        EXPECT_EQ(alive.use_count(), 4);
        expectAsserts("!child.isNull()", [&] { top.addChild(ObjPtr<XmlBaseElement>()); });
    }
    EXPECT_EQ(alive.use_count(), 1);
}

}  // namespace

}  // namespace Orv

// What is written, read back by a parser that takes nothing but well-formed XML.

#include <libxml/parser.h>
#include <libxml/tree.h>
#include <utility>

#include "xmlStreamer.h"
#include "xmlTesting.h"
#include "xmlTopElement.h"
#include "xmlWriter.h"

namespace Orv {

namespace {

struct Node {
    std::string name;
    std::vector<std::pair<std::string, std::string>> attributes;
    std::string text;  // ahead of the children
    std::vector<Node> children;

    bool operator==(const Node&) const = default;
};

using Document = std::unique_ptr<xmlDoc, decltype(&xmlFreeDoc)>;

std::string toString(const xmlChar* text) {
    return text != nullptr ? reinterpret_cast<const char*>(text) : "";
}

Document parse(std::string_view text) {
    const int options = XML_PARSE_HUGE | XML_PARSE_NONET;
    Document document(
        xmlReadMemory(text.data(), static_cast<int>(text.size()), "test", nullptr, options),
        &xmlFreeDoc);
    EXPECT_NE(document, nullptr) << text.substr(0, 2000);
    return document;
}

Node toNode(const xmlNode& element) {
    Node node;
    node.name = toString(element.name);
    for (const xmlAttr* attribute = element.properties; attribute; attribute = attribute->next) {
        node.attributes.emplace_back(
            toString(attribute->name),
            attribute->children != nullptr ? toString(attribute->children->content) : "");
    }
    for (const xmlNode* child = element.children; child; child = child->next) {
        if (child->type == XML_ELEMENT_NODE) {
            node.children.push_back(toNode(*child));
        } else {
            // Line ends and indentation come from the layout; the texts of the tests have no space.
            for (const char character : toString(child->content))
                if (character != ' ' && character != '\n') node.text += character;
        }
    }
    return node;
}

Node parseNode(std::string_view text) {
    const Document document = parse(text);
    const xmlNode* const root = document ? xmlDocGetRootElement(document.get()) : nullptr;
    EXPECT_NE(root, nullptr);
    return root != nullptr ? toNode(*root) : Node();
}

Node makeRandomNode(XmlRandom& random, unsigned depth) {
    Node node;
    node.name = "e" + std::to_string(random.below(1000));
    const unsigned nbAttributes = random.below(5);
    for (unsigned i = 0; i < nbAttributes; ++i) {
        node.attributes.emplace_back(
            "a" + std::to_string(i),
            random.text(random.below(random.below(8) == 0 ? 700 : 40), random.below(2) == 0));
    }
    if (random.below(3) == 0) {
        for (const char character : random.text(random.below(40), false))
            if (character != ' ') node.text += character;
    }
    if (depth > 0) {
        const unsigned nbChildren = random.below(5);
        for (unsigned i = 0; i < nbChildren; ++i)
            node.children.push_back(makeRandomNode(random, depth - 1));
    }
    return node;
}

template <class Parent>
void stream(Parent& parent, const Node& node) {
    XmlStreamer::ElementGuard element(parent, node.name.c_str());
    for (const auto& [name, value] : node.attributes)
        element.addAttribute(name.c_str(), value.c_str());
    if (!node.text.empty()) element.addTextData(xmlEscaped(node.text).c_str());
    for (const Node& child : node.children) stream(element, child);
}

void fill(XmlTopElement& element, const Node& node) {
    for (const auto& [name, value] : node.attributes)
        element.setAttribute(name.c_str(), value.c_str());
    for (const Node& child : node.children) fill(element.addChild(child.name.c_str()), child);
}

void dropTexts(Node& node) {
    node.text.clear();
    for (Node& child : node.children) dropTexts(child);
}

TEST(XmlParsed, randomDocumentsComeBackFromTheStreamer) {
    XmlRandom random(2);
    for (int i = 0; i < 200; ++i) {
        const Node node = makeRandomNode(random, 5);
        std::ostringstream output;
        {
            XmlStreamer document(output, i % 2 == 0, i % 3 == 0 ? node.name.c_str() : "");
            stream(document, node);
        }
        ASSERT_EQ(parseNode(output.str()), node) << output.str();
    }
}

TEST(XmlParsed, randomDocumentsComeBackFromTheWriter) {
    XmlRandom random(3);
    XmlWriter writer;
    for (int i = 0; i < 200; ++i) {
        Node node = makeRandomNode(random, 5);
        dropTexts(node);
        XmlTopElement top(node.name.c_str());
        fill(top, node);
        const LiString xml = i % 3 == 0   ? writer.toXml(top)
                             : i % 3 == 1 ? writer.toXmlDocument(top)
                                          : writer.toXmlDocument(top, node.name.c_str());
        ASSERT_EQ(parseNode(xml.getText()), node) << xml;
    }
}

TEST(XmlParsed, everyPrintableCharacterComesBack) {
    std::string every;
    for (char character = 0x20; character < 0x7F; ++character) every += character;
    std::ostringstream output;
    {
        XmlStreamer document(output, false);
        XmlStreamer::ElementGuard(document, "e").addAttribute("a", every.c_str());
    }
    XmlTopElement top("e");
    top.setAttribute("a", every.c_str());
    for (const std::string& xml :
         {output.str(), std::string(XmlWriter().toXml(top).getText().substr(1))}) {
        const Node node = parseNode(xml);
        ASSERT_EQ(node.attributes.size(), 1U);
        EXPECT_EQ(node.attributes[0].second, every);
    }
}

TEST(XmlParsed, aSectionOfCharacterDataEndsWithTheNextTextsFirstCharacter) {
    std::ostringstream output;
    {
        XmlStreamer document(output, false);
        XmlStreamer::ElementGuard element(document, "e");
        element.addCharacterData("1<2&&3]");
        element.addTextData(">tail");
    }
    EXPECT_EQ(parseNode(output.str()).text, "1<2&&3]tail");
}

std::size_t depthOf(const Document& document) {
    std::size_t depth = 0;
    const xmlNode* node = document ? xmlDocGetRootElement(document.get()) : nullptr;
    for (; node != nullptr; node = xmlFirstElementChild(const_cast<xmlNode*>(node))) ++depth;
    return depth;
}

TEST(XmlParsed, deepDocumentsAreWellFormed) {
    constexpr std::size_t STREAMED = 10000, WRITTEN = 2000;
    std::ostringstream output;
    {
        XmlStreamer document(output, true);
        std::vector<std::unique_ptr<XmlStreamer::ElementGuard>> open;
        open.push_back(std::make_unique<XmlStreamer::ElementGuard>(document, "e"));
        while (open.size() < STREAMED)
            open.push_back(std::make_unique<XmlStreamer::ElementGuard>(*open.back(), "e"));
        while (!open.empty()) open.pop_back();
    }
    EXPECT_EQ(depthOf(parse(output.str())), STREAMED);

    XmlTopElement top("e");
    XmlTopElement* innermost = &top;
    for (std::size_t i = 1; i < WRITTEN; ++i) {
        innermost = &innermost->addChild("e");
        innermost->setAttribute("level", i);
    }
    const LiString xml = XmlWriter().toXmlDocument(top);
    EXPECT_EQ(depthOf(parse(xml.getText())), WRITTEN);
}

}  // namespace

}  // namespace Orv

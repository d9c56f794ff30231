#include <iomanip>
#include <limits>
#include <locale>

#include "expectThrows.h"
#include "xmlEx.h"
#include "xmlStreamer.h"
#include "xmlTesting.h"

namespace Orv {

namespace {

using Element = XmlStreamer::ElementGuard;

/// What @p write writes into a document without prologue.
std::string textOf(const std::function<void(XmlStreamer&)>& write) {
    std::ostringstream output;
    {
        XmlStreamer document(output, false);
        write(document);
    }
    return output.str();
}

TEST(XmlStreamer, writesDeclarationAndDocumentType) {
    const struct {
        bool writeDeclaration;
        const char* documentType;
        const char* expected;
    } rows[] = {
        {false, "", ""},
        {true, "", "<?xml version=\"1.0\"?>\n"},
        {false, "movie", "<!DOCTYPE movie>\n"},
        {true, "m SYSTEM \"m.dtd\"", "<?xml version=\"1.0\"?>\n<!DOCTYPE m SYSTEM \"m.dtd\">\n"},
    };
    for (const auto& row : rows) {
        std::ostringstream output;
        const XmlStreamer document(output, row.writeDeclaration, row.documentType);
        EXPECT_EQ(output.str(), row.expected);
    }
}

TEST(XmlStreamer, writesElementsByteForByte) {
    const struct {
        int line;
        std::function<void(XmlStreamer&)> write;
        const char* expected;
    } rows[] = {
        {__LINE__, [](XmlStreamer& document) { Element(document, "a"); }, "<a />\n"},
        {__LINE__,
         [](XmlStreamer& document) {
             Element a(document, "a");
             a.addAttribute("one", "1");
             a.addAttribute("two", "");
         },
         "<a one=\"1\" two=\"\" />\n"},
        {__LINE__,
         [](XmlStreamer& document) {
             Element(document, "a").addAttribute("all", "x\"&'<>&amp;\n\t\x01\xC3\xA9");
         },
         "<a all=\"x&quot;&amp;&apos;&lt;&gt;&amp;amp;\n\t\x01\xC3\xA9\" />\n"},
        {__LINE__,
         [](XmlStreamer& document) {
             Element a(document, "a");
             a.addAttribute("x", LiString("<"));
             {
                 Element(a, "b").addAttribute("y", "2");
             }
             Element c(a, "c");
             const Element d(c, "d");
         },
         "<a x=\"&lt;\" >\n<b y=\"2\" />\n<c >\n<d />\n</c>\n</a>\n"},
        {__LINE__,
         [](XmlStreamer& document) {
             Element a(document, "a");
             a.addTextData("1 < 2 & \"3\"");
             a.addTextData(LiString("more"));
             const Element b(a, "b");
         },
         "<a >\n1 < 2 & \"3\"more<b />\n</a>\n"},
        {__LINE__,
         [](XmlStreamer& document) {
             Element a(document, "a");
             a.addCharacterData("1 < 2");
             a.addCharacterData(LiString("]]>"));
         },
         "<a >\n<![CDATA[1 < 2]]<![CDATA[]]>]]</a>\n"},
        {__LINE__, [](XmlStreamer& document) { Element(document, "a").addTextData(""); },
         "<a >\n</a>\n"},
        {__LINE__,
         [](XmlStreamer& document) {
             Element a(document, static_cast<const char*>(nullptr));
             a.addAttribute(nullptr, static_cast<const char*>(nullptr));
             a.addAttribute(nullptr, 1);
             a.addTextData(static_cast<const char*>(nullptr));
             a.addCharacterData(static_cast<const char*>(nullptr));
         },
         "< =\"\" =\"1\" >\n<![CDATA[]]</>\n"},
        {__LINE__,  // wrong, but written as it comes
         [](XmlStreamer& document) {
             Element a(document, "a");
             auto b = std::make_unique<Element>(a, "b");
             const auto c = std::make_unique<Element>(a, "c");
             const auto d = std::make_unique<Element>(a, "d");
             b->addAttribute("x", 1);
             b.reset();
             a.addTextData("t");
         },
         "<a >\n<b <c <d x=\"1\" />\nt/>\n/>\n</a>\n"},
    };
    for (const auto& row : rows) EXPECT_EQ(textOf(row.write), row.expected) << "line " << row.line;
}

TEST(XmlStreamer, writesNumbersOfEveryTypeAsTheStreamDoes) {
    const auto write = [](Element& element) {
        element.addAttribute("i", std::numeric_limits<int>::min());
        element.addAttribute("u", std::numeric_limits<unsigned>::max());
        element.addAttribute("l", 12345L);
        element.addAttribute("ul", 12345UL);
        element.addAttribute("ll", std::numeric_limits<long long>::min());
        element.addAttribute("ull", std::numeric_limits<unsigned long long>::max());
        element.addAttribute("c", static_cast<signed char>(65));
        element.addAttribute("d", 1234567.5);
        element.addAttribute("f", 0.1f);
    };
    EXPECT_EQ(textOf([&](XmlStreamer& document) {
                  Element a(document, "a");
                  write(a);
              }),
              "<a i=\"-2147483648\" u=\"4294967295\" l=\"12345\" ul=\"12345\" "
              "ll=\"-9223372036854775808\" ull=\"18446744073709551615\" c=\"65\" d=\"1.23457e+06\" "
              "f=\"0.1\" />\n");
}

/// Groups digits by threes and has a decimal comma.
struct Grouping : std::numpunct<char> {
    char do_thousands_sep() const override { return '.'; }
    char do_decimal_point() const override { return ','; }
    std::string do_grouping() const override { return "\3"; }
};

TEST(XmlStreamer, formatsNumbersButNotTextsAsTheStreamIsSet) {
    const std::locale grouping(std::locale::classic(), new Grouping);
    const struct {
        int line;
        std::function<void(std::ostream&)> set;
        const char* integer;  // 1000000
        const char* real;     // 1234.5
    } rows[] = {
        {__LINE__, [](std::ostream&) {}, "1000000", "1234.5"},
        {__LINE__, [](std::ostream& output) { output << std::hex << std::showbase; }, "0xf4240",
         "1234.5"},
        {__LINE__, [](std::ostream& output) { output << std::oct; }, "3641100", "1234.5"},
        {__LINE__, [](std::ostream& output) { output.unsetf(std::ios::basefield); }, "1000000",
         "1234.5"},
        {__LINE__, [](std::ostream& output) { output << std::showpos << std::scientific; },
         "+1000000", "+1.234500e+03"},
        {__LINE__, [](std::ostream& output) { output << std::fixed << std::setprecision(3); },
         "1000000", "1234.500"},
        {__LINE__, [&](std::ostream& output) { output.imbue(grouping); }, "1.000.000", "1.234,5"},
        {__LINE__,
         [](std::ostream& output) { output << std::setfill('*') << std::left << std::setw(10); },
         "1000000***", "1234.5"},
    };
    for (const auto& row : rows) {
        std::ostringstream output;
        XmlStreamer document(output, false);
        row.set(output);
        {
            Element a(document, "1000");
            a.addAttribute("1000", "1000");
            a.addAttribute("i", 1000000);
            a.addAttribute("r", 1234.5);
        }
        EXPECT_EQ(output.str(), std::string("<1000 1000=\"1000\" i=\"") + row.integer + "\" r=\"" +
                                    row.real + "\" />\n")
            << "line " << row.line;
    }
}

TEST(XmlStreamer, escapesTextsOfEveryLengthAcrossItsBuffer) {
    XmlRandom random(1);
    std::string every;
    for (int character = 1; character < 256; ++character) every += static_cast<char>(character);
    std::vector<std::string> texts{every, every + every, std::string(100000, '<'),
                                   std::string(100000, 'x')};
    for (unsigned length = 0; length < 600; ++length) {
        texts.push_back(random.text(length, true));
        texts.push_back(std::string(length, 'x') + "&");
    }
    for (const std::string& text : texts) {
        ASSERT_EQ(textOf([&](XmlStreamer& document) {
                      Element a(document, text.c_str());
                      a.addAttribute(text.c_str(), text.c_str());
                      a.addTextData(text.c_str());
                  }),
                  "<" + text + " " + text + "=\"" + xmlEscaped(text) + "\" >\n" + text + "</" +
                      text + ">\n");
    }
}

TEST(XmlStreamer, refusesAttributesOnceThereIsContent) {
    const std::function<void(Element&)> contents[] = {
        [](Element& element) { element.addTextData("t"); },
        [](Element& element) { element.addTextData(static_cast<const char*>(nullptr)); },
        [](Element& element) { element.addCharacterData("t"); },
        [](Element& element) { const Element child(element, "c"); },
    };
    const std::function<void(Element&)> attributes[] = {
        [](Element& element) { element.addAttribute("x", "1"); },
        [](Element& element) { element.addAttribute("x", LiString("1")); },
        [](Element& element) { element.addAttribute("x", 1); },
        [](Element& element) { element.addAttribute("x", 1ULL); },
        [](Element& element) { element.addAttribute("x", 1.0); },
    };
    for (const auto& addContent : contents) {
        std::ostringstream output;
        XmlStreamer document(output, false);
        Element a(document, "a");
        EXPECT_FALSE(a.hasContent());
        addContent(a);
        EXPECT_TRUE(a.hasContent());
        const std::string before = output.str();
        for (const auto& addAttribute : attributes) {
            expectThrows<XmlEx::ExSyntaxError>(
                "Attribute \"x\" comes after the content of its element.",
                [&] { addAttribute(a); });
        }
        EXPECT_EQ(output.str(), before);
    }
    try {
        textOf([](XmlStreamer& document) {
            Element a(document, "a");
            a.addTextData("");
            a.addAttribute(nullptr, 1);
        });
        ADD_FAILURE() << "an attribute after content";
    } catch (const XmlEx& error) {
        EXPECT_NE(dynamic_cast<const std::logic_error*>(&error), nullptr);
        EXPECT_STREQ(error.getFile(), "src/resmgt/xmlStreamer");
        EXPECT_EQ(error.getLine(), 273);
    }
}

void writeSample(std::ostream& output) {
    XmlStreamer document(output, true, "sample");
    Element a(document, "alpha");
    a.addAttribute("text", "a<b");
    a.addAttribute("number", 12345);
    {
        Element b(a, "beta");
        b.addAttribute("real", 0.25);
        const Element c(b, "gamma");
    }
    a.addTextData("words");
    a.addCharacterData("data");
}

TEST(XmlStreamer, aStreamThatFailsTakesWhatItCanAndThrowsOnlyIfItShall) {
    XmlTraceCollector traces;
    std::ostringstream whole;
    writeSample(whole);
    const std::string expected = whole.str();
    for (std::size_t limit = 0; limit < expected.size(); ++limit) {
        for (const bool bufferThrows : {false, true}) {
            const testing::ScopedTrace where(__FILE__, __LINE__, std::to_string(limit));
            XmlLimitedBuffer silent(limit, bufferThrows);
            std::ostream silentOutput(&silent);
            EXPECT_NO_THROW(writeSample(silentOutput));
            EXPECT_TRUE(silentOutput.bad());
            EXPECT_EQ(silent.taken, expected.substr(0, limit));

            XmlLimitedBuffer loud(limit, bufferThrows);
            std::ostream loudOutput(&loud);
            loudOutput.exceptions(std::ios::badbit);
            if (bufferThrows) {
                EXPECT_THROW(writeSample(loudOutput), XmlLimitedBuffer::Full);
            } else {
                EXPECT_THROW(writeSample(loudOutput), std::ios_base::failure);
            }
            EXPECT_EQ(loud.taken, expected.substr(0, limit));
        }
    }
}

TEST(XmlStreamer, anExceptionOnItsWayIsNotReplacedByThatOfTheStream) {
    XmlTraceCollector traces;
    XmlLimitedBuffer buffer(3, false);
    std::ostream output(&buffer);
    output.exceptions(std::ios::badbit);
    const auto fail = [&] {
        XmlStreamer document(output, false);
        const Element a(document, "a");
        throw std::out_of_range("the application's");
    };
    expectThrows<std::out_of_range>("the application's", fail);
    EXPECT_NE(traces.getText().find("closing an XML element while the stack unwinds"),
              std::string::npos);
}

TEST(XmlStreamer, aGuardThatGoesBeforeOneOpenedInItAssertsAndHarmsNobody) {
    std::ostringstream output;
    const auto document = new XmlStreamer(output, false);
    const auto parent = new Element(*document, "parent");
    const auto first = new Element(*parent, "1");
    const auto middle = new Element(*parent, "2");
    const auto last = new Element(*parent, "3");
    delete middle;
    expectAsserts("!hasOpenChildren", [&] { delete parent; });
    first->addAttribute("x", 1);
    EXPECT_NO_THROW(delete first);
    const auto inside = new Element(*last, "4");
    EXPECT_NO_THROW(delete inside);
    EXPECT_NO_THROW(delete last);
    const auto next = new Element(*document, "next");
    expectAsserts("!hasOpenChildren", [&] { delete document; });
    EXPECT_NO_THROW(delete next);
    EXPECT_EQ(output.str(),
              "<parent >\n<1 <2 <3 />\n</parent>\nx=\"1\" />\n>\n<4 />\n</3>\n<next />\n");
}

TEST(XmlStreamer, leftGuardsAreOnlyTracedWhileTheStackUnwinds) {
    XmlTraceCollector traces;
    std::ostringstream output;
    XmlStreamer document(output, false);
    std::unique_ptr<Element> child;
    const auto fail = [&] {
        Element parent(document, "parent");
        child = std::make_unique<Element>(parent, "child");
        throw std::out_of_range("the application's");
    };
    expectThrows<std::out_of_range>("the application's", fail);
    EXPECT_NE(traces.getText().find("!hasOpenChildren"), std::string::npos);
}

TEST(XmlStreamer, nestsTenThousandDeep) {
    constexpr int DEPTH = 10000;
    std::string expected;
    for (int i = 0; i < DEPTH - 1; ++i) expected += "<e >\n";
    expected += "<e />\n";
    for (int i = 0; i < DEPTH - 1; ++i) expected += "</e>\n";
    EXPECT_EQ(textOf([](XmlStreamer& document) {
                  std::vector<std::unique_ptr<Element>> open;
                  open.push_back(std::make_unique<Element>(document, "e"));
                  while (open.size() < DEPTH)
                      open.push_back(std::make_unique<Element>(*open.back(), "e"));
                  while (!open.empty()) open.pop_back();
              }),
              expected);
}

}  // namespace

}  // namespace Orv

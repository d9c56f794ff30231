// A document of 10,000 elements, nested four deep, with three attributes each: a number, a plain
// text and one with five characters to escape. About 0.9 MB; the rate is that of each writer's own
// bytes, which differ by line ends and indentation, so the times are compared.

#include <QByteArray>
#include <QString>
#include <QXmlStreamWriter>
#include <benchmark/benchmark.h>
#include <charconv>
#include <libxml/xmlwriter.h>
#include <orv/xmlStreamer.h>
#include <orv/xmlTopElement.h>
#include <orv/xmlWriter.h>
#include <pugixml.hpp>
#include <sstream>
#include <string>

namespace {

constexpr int NB_CHAINS = 2500;
constexpr int DEPTH = 4;
constexpr const char* TAGS[DEPTH] = {"device", "stream", "format", "region"};
constexpr char NAME[] = "media-player";
constexpr char LABEL[] = "a < b & \"c\" is so";

using Orv::LiString;
using Orv::XmlStreamer;

template <class Parent>
void streamChain(Parent& parent, const LiString* tag, int nbLeft, int& number) {
    XmlStreamer::ElementGuard element(parent, *tag);
    element.addAttribute("id", number++);
    element.addAttribute("name", NAME);
    element.addAttribute("label", LABEL);
    if (nbLeft > 1) streamChain(element, tag + 1, nbLeft - 1, number);
}

std::size_t writeWithStreamer() {
    static const LiString root = "root";
    static const LiString tags[DEPTH] = {TAGS[0], TAGS[1], TAGS[2], TAGS[3]};
    std::ostringstream output;
    {
        XmlStreamer document(output, true);
        XmlStreamer::ElementGuard top(document, root);
        int number = 0;
        for (int chain = 0; chain < NB_CHAINS; ++chain) streamChain(top, tags, DEPTH, number);
    }
    return output.str().size();
}

std::size_t writeWithWriter() {
    static const LiString tags[DEPTH] = {TAGS[0], TAGS[1], TAGS[2], TAGS[3]};
    static const LiString id = "id", name = "name", label = "label";
    static const LiString nameValue = NAME, labelValue = LABEL;
    Orv::XmlTopElement top("root");
    for (int chain = 0, number = 0; chain < NB_CHAINS; ++chain) {
        Orv::XmlTopElement* element = &top;
        for (const LiString& tag : tags) {
            element = &element->addChild(tag);
            element->setAttribute(id, number++);
            element->setAttribute(name, nameValue);
            element->setAttribute(label, labelValue);
        }
    }
    return static_cast<std::size_t>(Orv::XmlWriter().toXmlDocument(top).getLength());
}

std::size_t writeWithPugixml() {
    pugi::xml_document document;
    pugi::xml_node root = document.append_child("root");
    for (int chain = 0, number = 0; chain < NB_CHAINS; ++chain) {
        pugi::xml_node element = root;
        for (const char* const tag : TAGS) {
            element = element.append_child(tag);
            element.append_attribute("id") = number++;
            element.append_attribute("name") = NAME;
            element.append_attribute("label") = LABEL;
        }
    }
    std::ostringstream output;
    document.save(output, "", pugi::format_raw);
    return output.str().size();
}

std::size_t writeWithQt() {
    static const QString root = "root", id = "id", name = "name", label = "label";
    static const QString nameValue = NAME, labelValue = LABEL;
    static const QString tags[DEPTH] = {TAGS[0], TAGS[1], TAGS[2], TAGS[3]};
    QByteArray output;
    QXmlStreamWriter writer(&output);
    writer.writeStartDocument();
    writer.writeStartElement(root);
    for (int chain = 0, number = 0; chain < NB_CHAINS; ++chain) {
        for (const QString& tag : tags) {
            writer.writeStartElement(tag);
            writer.writeAttribute(id, QString::number(number++));
            writer.writeAttribute(name, nameValue);
            writer.writeAttribute(label, labelValue);
        }
        for (int i = 0; i < DEPTH; ++i) writer.writeEndElement();
    }
    writer.writeEndElement();
    writer.writeEndDocument();
    return static_cast<std::size_t>(output.size());
}

const xmlChar* toXmlChars(const char* text) {
    return reinterpret_cast<const xmlChar*>(text);
}

std::size_t writeWithLibxml2() {
    const xmlBufferPtr output = xmlBufferCreate();
    const xmlTextWriterPtr writer = xmlNewTextWriterMemory(output, 0);
    xmlTextWriterStartDocument(writer, nullptr, nullptr, nullptr);
    xmlTextWriterStartElement(writer, toXmlChars("root"));
    char digits[16];
    for (int chain = 0, number = 0; chain < NB_CHAINS; ++chain) {
        for (const char* const tag : TAGS) {
            xmlTextWriterStartElement(writer, toXmlChars(tag));
            *std::to_chars(digits, digits + sizeof digits - 1, number++).ptr = '\0';
            xmlTextWriterWriteAttribute(writer, toXmlChars("id"), toXmlChars(digits));
            xmlTextWriterWriteAttribute(writer, toXmlChars("name"), toXmlChars(NAME));
            xmlTextWriterWriteAttribute(writer, toXmlChars("label"), toXmlChars(LABEL));
        }
        for (int i = 0; i < DEPTH; ++i) xmlTextWriterEndElement(writer);
    }
    xmlTextWriterEndDocument(writer);
    xmlFreeTextWriter(writer);
    const std::size_t size = static_cast<std::size_t>(xmlBufferLength(output));
    xmlBufferFree(output);
    return size;
}

template <auto write>
void measure(benchmark::State& state) {
    std::size_t nbBytes = 0;
    for (auto _ : state) benchmark::DoNotOptimize(nbBytes = write());
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) *
                            static_cast<std::int64_t>(nbBytes));
    state.counters["bytes"] = static_cast<double>(nbBytes);
}

BENCHMARK(measure<writeWithStreamer>)->Name("write/XmlStreamer")->Unit(benchmark::kMillisecond);
BENCHMARK(measure<writeWithWriter>)->Name("write/XmlWriter")->Unit(benchmark::kMillisecond);
BENCHMARK(measure<writeWithPugixml>)->Name("write/pugixml")->Unit(benchmark::kMillisecond);
BENCHMARK(measure<writeWithQt>)->Name("write/QXmlStreamWriter")->Unit(benchmark::kMillisecond);
BENCHMARK(measure<writeWithLibxml2>)->Name("write/libxml2")->Unit(benchmark::kMillisecond);

}  // namespace

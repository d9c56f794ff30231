#include "xmlBaseElement.h"

#include "xmlWriter.h"

namespace Orv {

XmlBaseElement::~XmlBaseElement() = default;

void XmlBaseElement::streamAttributes(XmlWriter&) const {}

void XmlBaseElement::streamChildren(XmlWriter&) const {}

void XmlBaseElement::streamToOutput(XmlWriter& writer) const {
    const LiString name = getName();
    writer.startElement(name);
    streamAttributes(writer);
    streamChildren(writer);
    writer.endElement(name);
}

}  // namespace Orv

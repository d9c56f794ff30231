#pragma once

#include "liString.h"

namespace Orv {

class XmlWriter;

/// What XmlWriter can write: a name, attributes, and children.
///
/// Derive from it to write a class's own objects; XmlTopElement is one that is filled by hand.
class ORV_RESMGT_API XmlBaseElement {
public:
    XmlBaseElement() = default;
    virtual ~XmlBaseElement();

    XmlBaseElement(const XmlBaseElement&) = delete;
    XmlBaseElement& operator=(const XmlBaseElement&) = delete;

    virtual LiString getName() const = 0;

    /// Calls XmlWriter::writeAttribute() for each; none as it stands.
    virtual void streamAttributes(XmlWriter& writer) const;

    /// Calls streamToOutput() of each, or startElement() to endElement(); none as it stands.
    virtual void streamChildren(XmlWriter& writer) const;

    /// The whole element: start, attributes, children, end.
    void streamToOutput(XmlWriter& writer) const;
};

}  // namespace Orv

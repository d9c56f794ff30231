#pragma once

#include <concepts>
#include <string>
#include <string_view>
#include <vector>

#include "objPtr.h"
#include "xmlBaseElement.h"

namespace Orv {

/// An element that is filled by hand and written by XmlWriter: the top of a document, or inside one.
///
/// A tree of them is written and destroyed without recursion, however deep it is.
class ORV_RESMGT_API XmlTopElement final : public XmlBaseElement {
public:
    explicit XmlTopElement(const LiString& name);
    ~XmlTopElement() override;

    LiString getName() const override { return _name; }

    /// Adds the attribute, or gives the one of that name another value.
    void setAttribute(const LiString& name, const LiString& value);

    /// An integer in decimal, 8-bit ones as numbers too.
    template <std::integral T>
    void setAttribute(const LiString& name, T value) {
        setAttribute(name, LiString(std::string_view(std::to_string(+value))));
    }

    /// Adds a new element behind the children that there are.
    /// @return the element; lives as long as this one.
    XmlTopElement& addChild(const LiString& name);

    /// Adds an element of any class, which must not be null.
    void addChild(ObjPtr<XmlBaseElement> child);

    void streamAttributes(XmlWriter& writer) const override;
    void streamChildren(XmlWriter& writer) const override;

private:
    struct Attribute {
        LiString name;
        LiString value;
    };

    LiString _name;
    std::vector<Attribute> _attributes;             // in the order they were added
    std::vector<ObjPtr<XmlBaseElement>> _children;  // none is null
};

}  // namespace Orv

#include "xmlTopElement.h"

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <new>
#include <utility>

#include "assertions.h"
#include "xmlWriter.h"

namespace Orv {

XmlTopElement::XmlTopElement(const LiString& name) : _name(name) {}

XmlTopElement::~XmlTopElement() {
    // Each element gives its children to its parent before it goes, so that no destructor runs
    // inside another. Where there is no memory for that, the rest is destroyed by recursion.
    try {
        while (!_children.empty()) {
            const ObjPtr<XmlBaseElement> child = std::move(_children.back());
            _children.pop_back();
            if (auto* const plain = dynamic_cast<XmlTopElement*>(child.get())) {
                _children.insert(_children.end(), std::move_iterator(plain->_children.begin()),
                                 std::move_iterator(plain->_children.end()));
                plain->_children.clear();
            }
        }
    } catch (const std::bad_alloc&) {
    }
}

void XmlTopElement::setAttribute(const LiString& name, const LiString& value) {
    const auto found =
        std::find_if(_attributes.begin(), _attributes.end(),
                     [&](const Attribute& attribute) { return attribute.name == name; });
    if (found != _attributes.end()) {
        found->value = value;
    } else {
        _attributes.push_back({name, value});
    }
}

XmlTopElement& XmlTopElement::addChild(const LiString& name) {
    auto* const child = new XmlTopElement(name);
    addChild(ObjPtr<XmlBaseElement>(child));
    return *child;
}

void XmlTopElement::addChild(ObjPtr<XmlBaseElement> child) {
    ORV_ASSERT(!child.isNull());
    _children.push_back(std::move(child));
}

void XmlTopElement::streamAttributes(XmlWriter& writer) const {
    for (const Attribute& attribute : _attributes)
        writer.writeAttribute(attribute.name, attribute.value);
}

void XmlTopElement::streamChildren(XmlWriter& writer) const {
    struct Level {
        const XmlTopElement* element;
        std::size_t nextChild;
    };
    std::vector<Level> levels{{this, 0}};
    while (true) {
        const XmlTopElement& element = *levels.back().element;
        if (levels.back().nextChild == element._children.size()) {
            levels.pop_back();
            if (levels.empty()) return;
            writer.endElement(element._name);
            continue;
        }
        const XmlBaseElement& child = *element._children[levels.back().nextChild++];
        if (const auto* const plain = dynamic_cast<const XmlTopElement*>(&child)) {
            writer.startElement(plain->_name);
            plain->streamAttributes(writer);
            levels.push_back({plain, 0});
        } else {
            child.streamToOutput(writer);
        }
    }
}

}  // namespace Orv

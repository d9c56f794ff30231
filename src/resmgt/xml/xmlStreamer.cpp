#include "xmlStreamer.h"

#include <exception>

#include "assertions.h"
#include "xmlEx.h"
#include "xmlOutputPrivate.h"

namespace Orv {

XmlStreamer::XmlStreamer(std::ostream& output, bool writeDeclaration, const LiString& documentType)
    : _root(output) {
    XmlOutput text(output);
    if (writeDeclaration) text.put("<?xml version=\"1.0\"?>\n");
    if (!documentType.isEmpty())
        text.put("<!DOCTYPE ").put(XmlText::viewOf(documentType)).put(">\n");
    text.flush();
}

XmlStreamer::~XmlStreamer() noexcept(false) = default;

XmlStreamer::NodeGuard::NodeGuard(NodeGuard& parent) : _output(parent._output) {
    parent.setContent();
    _parent = &parent;
    _previous = parent._lastChild;
    if (_previous != nullptr) _previous->_next = this;
    parent._lastChild = this;
}

XmlStreamer::NodeGuard::~NodeGuard() noexcept(false) {
    leaveParent();
    const bool hasOpenChildren = _lastChild != nullptr;
    while (_lastChild != nullptr) _lastChild->leaveParent();
    ORV_ASSERT_IN_DESTRUCTOR(!hasOpenChildren);
}

void XmlStreamer::NodeGuard::leaveParent() noexcept {
    if (_parent == nullptr) return;
    (_next != nullptr ? _next->_previous : _parent->_lastChild) = _previous;
    if (_previous != nullptr) _previous->_next = _next;
    _parent = _previous = _next = nullptr;
}

XmlStreamer::ElementGuard::ElementGuard(XmlStreamer& document, const LiString& name)
    : NodeGuard(document._root), _name(name) {
    open();
}

XmlStreamer::ElementGuard::ElementGuard(ElementGuard& parent, const LiString& name)
    : NodeGuard(parent), _name(name) {
    open();
}

XmlStreamer::ElementGuard::~ElementGuard() noexcept(false) {
    const bool hadContent = hasContent();
    NodeGuard::setContent(true);
    try {
        close(hadContent);
    } catch (...) {
        if (std::uncaught_exceptions() == 0) throw;
        Assertions::traceCurrentException("closing an XML element while the stack unwinds");
    }
}

void XmlStreamer::ElementGuard::open() {
    XmlOutput(_output).put("<").put(XmlText::viewOf(_name)).put(" ").flush();
}

void XmlStreamer::ElementGuard::close(bool hadContent) {
    XmlOutput text(_output);
    if (hadContent) {
        text.put("</").put(XmlText::viewOf(_name)).put(">\n");
    } else {
        text.put("/>\n");
    }
    text.flush();
}

void XmlStreamer::ElementGuard::setContent() {
    if (hasContent()) return;
    NodeGuard::setContent(true);
    XmlOutput(_output).put(">\n").flush();
}

void XmlStreamer::ElementGuard::checkStartTagIsOpen(const char* attribute) const {
    // The line that is reported for this error in every version.
    if (hasContent()) throw XmlEx::ExSyntaxError(ORV_FILE, 273, XmlText::viewOf(attribute));
}

void XmlStreamer::ElementGuard::addAttribute(const char* name, const char* value) {
    checkStartTagIsOpen(name);
    XmlOutput text(_output);
    text.put(XmlText::viewOf(name)).put("=\"").putEscaped(XmlText::viewOf(value)).put("\" ");
    text.flush();
}

void XmlStreamer::ElementGuard::addAttribute(const char* name, const LiString& value) {
    addAttribute(name, value.getChars());
}

template <class T>
void XmlStreamer::ElementGuard::addNumber(const char* name, T value) {
    checkStartTagIsOpen(name);
    XmlOutput text(_output);
    text.put(XmlText::viewOf(name)).put("=\"").flush();
    _output << value;
    text.put("\" ").flush();
}

void XmlStreamer::ElementGuard::addAttribute(const char* name, int value) {
    addNumber(name, value);
}
void XmlStreamer::ElementGuard::addAttribute(const char* name, unsigned value) {
    addNumber(name, value);
}
void XmlStreamer::ElementGuard::addAttribute(const char* name, long value) {
    addNumber(name, value);
}
void XmlStreamer::ElementGuard::addAttribute(const char* name, unsigned long value) {
    addNumber(name, value);
}
void XmlStreamer::ElementGuard::addAttribute(const char* name, long long value) {
    addNumber(name, value);
}
void XmlStreamer::ElementGuard::addAttribute(const char* name, unsigned long long value) {
    addNumber(name, value);
}
void XmlStreamer::ElementGuard::addAttribute(const char* name, double value) {
    addNumber(name, value);
}

void XmlStreamer::ElementGuard::addTextData(const char* text) {
    setContent();
    XmlOutput(_output).put(XmlText::viewOf(text)).flush();
}

void XmlStreamer::ElementGuard::addCharacterData(const char* text) {
    setContent();
    XmlOutput(_output).put("<![CDATA[").put(XmlText::viewOf(text)).put("]]").flush();
}

}  // namespace Orv

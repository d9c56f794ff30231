#include "xmlStreamer.h"

#include <array>
#include <charconv>
#include <exception>
#include <locale>
#include <type_traits>

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

XmlStreamer::NodeGuard::NodeGuard(NodeGuard& parent, const LiString& name)
    : _output(parent._output) {
    XmlOutput text(_output);
    parent.setContent(text);
    text.put("<").put(XmlText::viewOf(name)).put(" ").flush();
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
    : NodeGuard(document._root, name), _name(name) {}

XmlStreamer::ElementGuard::ElementGuard(ElementGuard& parent, const LiString& name)
    : NodeGuard(parent, name), _name(name) {}

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

void XmlStreamer::ElementGuard::close(bool hadContent) {
    XmlOutput text(_output);
    if (hadContent) {
        text.put("</").put(XmlText::viewOf(_name)).put(">\n");
    } else {
        text.put("/>\n");
    }
    text.flush();
}

void XmlStreamer::ElementGuard::setContent(XmlOutput& output) {
    if (hasContent()) return;
    NodeGuard::setContent(true);
    output.put(">\n");
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

namespace {

/// Whether `stream << integer` writes plain decimal digits, as it does unless told otherwise.
bool writesPlainIntegers(const std::ostream& stream) {
    constexpr auto SIGN_AND_BASE = std::ios::showpos | std::ios::oct | std::ios::hex;
    return (stream.flags() & SIGN_AND_BASE) == 0 && stream.width() == 0 &&
           stream.getloc() == std::locale::classic();
}

/// Puts an integer, if the stream would not write it otherwise, without entering the stream.
template <class T>
bool putPlainInteger(XmlOutput& output, const std::ostream& stream, T value) {
    if constexpr (std::is_integral_v<T>) {
        if (!writesPlainIntegers(stream)) return false;
        std::array<char, 24> digits;  // it has at most 20 characters
        const auto end = std::to_chars(digits.data(), digits.data() + digits.size(), value).ptr;
        output.put({digits.data(), end});
        return true;
    }
    return false;
}

}  // namespace

template <class T>
void XmlStreamer::ElementGuard::addNumber(const char* name, T value) {
    checkStartTagIsOpen(name);
    XmlOutput text(_output);
    text.put(XmlText::viewOf(name)).put("=\"");
    if (!putPlainInteger(text, _output, value)) {
        text.flush();
        _output << value;
    }
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
    XmlOutput output(_output);
    setContent(output);
    output.put(XmlText::viewOf(text)).flush();
}

void XmlStreamer::ElementGuard::addCharacterData(const char* text) {
    XmlOutput output(_output);
    setContent(output);
    output.put("<![CDATA[").put(XmlText::viewOf(text)).put("]]").flush();
}

}  // namespace Orv

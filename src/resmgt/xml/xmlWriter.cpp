#include "xmlWriter.h"

#include <algorithm>

#include "assertions.h"
#include "xmlEx.h"
#include "xmlTextPrivate.h"
#include "xmlTopElement.h"

namespace Orv {

/// What a call that throws has changed is undone.
template <class Change>
void XmlWriter::changeOrUndo(Change change) {
    const State before = _state;
    const std::size_t length = _text.size();
    try {
        change();
    } catch (...) {
        // An element that is being written may have reset the writer; then there is less to keep.
        _text.resize(std::min(length, _text.size()));
        _state = before;
        throw;
    }
}

LiString XmlWriter::toXml(const XmlBaseElement& element) {
    return finish(element, "");
}

LiString XmlWriter::toXmlDocument(const XmlTopElement& top) {
    return finish(top, "<?xml version='1.0'?>\n\n");
}

LiString XmlWriter::toXmlDocument(const XmlTopElement& top, const LiString& documentType) {
    if (documentType.isEmpty()) return toXmlDocument(top);
    const LiString prologue = "<?xml version='1.0'?>\n\n<!DOCTYPE " + documentType + ">\n";
    return finish(top, XmlText::viewOf(prologue));
}

LiString XmlWriter::finish(const XmlBaseElement& element, std::string_view prologue) {
    LiString xml;
    changeOrUndo([&] {
        const std::uint32_t depth = _state.depth;
        _text += prologue;
        element.streamToOutput(*this);
        ORV_ASSERT(_state.depth == depth);
        xml = getXml();
    });
    reset();
    return xml;
}

void XmlWriter::startElement(const LiString& name) {
    changeOrUndo([&] {
        closeStartTag();
        _text += '\n';
        indent(_state.depth);
        _text.append("<").append(XmlText::viewOf(name));
    });
    ++_state.depth;
    _state.isStartTagOpen = true;
}

void XmlWriter::endElement(const LiString& name) {
    ORV_ASSERT(_state.depth > 0);
    changeOrUndo([&] {
        closeStartTag();
        indent(_state.depth - 1);
        _text.append("</").append(XmlText::viewOf(name)).append(">\n");
    });
    --_state.depth;
}

void XmlWriter::writeAttribute(const LiString& name, const LiString& value) {
    appendAttribute(name, [&] {
        XmlText::escape(XmlText::viewOf(value), [&](std::string_view piece) { _text += piece; });
    });
}

void XmlWriter::writeNumber(const LiString& name, std::int64_t value) {
    appendAttribute(name, [&] { _text += std::to_string(value); });
}

void XmlWriter::writeNumber(const LiString& name, std::uint64_t value) {
    appendAttribute(name, [&] { _text += std::to_string(value); });
}

void XmlWriter::reset() noexcept {
    _text.clear();
    _state = State();
}

template <class AppendValue>
void XmlWriter::appendAttribute(const LiString& name, AppendValue appendValue) {
    if (!_state.isStartTagOpen)
        throw XmlEx::ExSyntaxError(ORV_FILE, __LINE__, XmlText::viewOf(name));
    changeOrUndo([&] {
        _text += '\n';
        indent(_state.depth);
        _text.append(XmlText::viewOf(name)).append("=\"");
        appendValue();
        _text += '"';
    });
}

void XmlWriter::closeStartTag() {
    if (_state.isStartTagOpen) _text += ">\n";
    _state.isStartTagOpen = false;
}

}  // namespace Orv

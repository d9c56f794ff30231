#pragma once

#include <concepts>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

#include "liString.h"

namespace Orv {

class XmlBaseElement;
class XmlTopElement;

/// Makes the text of a whole tree of elements, indented by four spaces a level with each attribute
/// in a line of its own. To write to a stream as one goes take XmlStreamer.
///
/// Elements write themselves by startElement(), writeAttribute() and endElement(). Names are written
/// as given. The indentation makes a text grow with the square of its depth.
///
/// - Errors: LiStringEx::ExTooLong for a text beyond 2147483647 characters; endElement() without
///   its startElement() asserts. What fails, an element that throws included, leaves the text as it
///   was.
class ORV_RESMGT_API XmlWriter {
public:
    XmlWriter() = default;

    XmlWriter(const XmlWriter&) = delete;
    XmlWriter& operator=(const XmlWriter&) = delete;

    /// Writes the element, returns the text and starts again. Asserts that the element ended what it
    /// started.
    LiString toXml(const XmlBaseElement& element);

    /// The same with "<?xml version='1.0'?>" and a document type, unless that is empty, ahead of it.
    LiString toXmlDocument(const XmlTopElement& top);
    LiString toXmlDocument(const XmlTopElement& top, const LiString& documentType);

    void startElement(const LiString& name);
    void endElement(const LiString& name);

    /// The value's `"&'<>` are escaped.
    /// @throws XmlEx::ExSyntaxError  if the element started last has content or has ended.
    void writeAttribute(const LiString& name, const LiString& value);

    /// An integer in decimal, 8-bit ones as numbers too.
    template <std::integral T>
    void writeAttribute(const LiString& name, T value) {
        if constexpr (std::signed_integral<T>) {
            writeNumber(name, static_cast<std::int64_t>(value));
        } else {
            writeNumber(name, static_cast<std::uint64_t>(value));
        }
    }

    /// The text so far.
    LiString getXml() const { return LiString(std::string_view(_text)); }

    void reset() noexcept;  ///< Starts again.

private:
    struct State {
        std::uint32_t depth = 0;
        // Of the innermost element alone: a start tag is closed before a child opens, so no other
        // one can be open, however many elements are.
        bool isStartTagOpen = false;
    };

    std::string _text;  // keeps its memory when the writer starts again
    State _state;

    LiString finish(const XmlBaseElement& element, std::string_view prologue);
    void writeNumber(const LiString& name, std::int64_t value);
    void writeNumber(const LiString& name, std::uint64_t value);

    template <class Change>
    void changeOrUndo(Change change);
    template <class AppendValue>
    void appendAttribute(const LiString& name, AppendValue appendValue);
    void closeStartTag();
    void indent(std::uint32_t depth) { _text.append(4 * std::size_t{depth}, ' '); }
};

}  // namespace Orv

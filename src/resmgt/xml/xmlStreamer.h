#pragma once

#include <iosfwd>

#include "liString.h"

namespace Orv {

class XmlOutput;

/// Writes XML straight to a stream: an ElementGuard opens an element and closes it when it goes, so
/// the nesting of guards is that of the document. To write a tree of objects take XmlWriter.
///
/// Every call writes at once, so text of one's own may be put into the stream in between. Texts are
/// written as they are, whatever the stream's field width; numbers as `stream << number` gives them,
/// with the stream's flags, precision and locale. Null texts are empty.
///
/// - Threads: a streamer and its guards are used by one thread at a time.
/// - Errors: a stream that fails sets its state, or throws what it was told to throw, as from `<<`;
///   a destructor traces that instead while the stack unwinds. A guard, or the streamer, that goes
///   before a guard opened in it asserts.
class ORV_RESMGT_API XmlStreamer {
public:
    /// @param output        borrowed, must outlive the streamer and its guards.
    /// @param documentType  what follows "<!DOCTYPE "; empty for none.
    XmlStreamer(std::ostream& output, bool writeDeclaration,
                const LiString& documentType = LiString());
    ~XmlStreamer() noexcept(false);

    XmlStreamer(const XmlStreamer&) = delete;
    XmlStreamer& operator=(const XmlStreamer&) = delete;

    /// A place of the document that elements can be opened in.
    class ORV_RESMGT_API NodeGuard {
    public:
        NodeGuard(const NodeGuard&) = delete;
        NodeGuard& operator=(const NodeGuard&) = delete;

        bool hasContent() const noexcept { return _hasContent; }  ///< Anything after its start tag.

    protected:
        /// Tells the parent that it has content, and writes the beginning of the start tag.
        NodeGuard(NodeGuard& parent, const LiString& name);
        virtual ~NodeGuard() noexcept(false);

        void setContent(bool hasContent) noexcept { _hasContent = hasContent; }

        std::ostream& _output;

    private:
        friend class XmlStreamer;

        explicit NodeGuard(std::ostream& output) noexcept : _output(output) {}

        /// Called by a child that opens; an element writes the end of its start tag.
        virtual void setContent(XmlOutput&) { setContent(true); }

        void leaveParent() noexcept;

        NodeGuard* _parent = nullptr;  // null for the root, and once the parent has gone
        // The guards open in this one, as a list whose links they carry.
        NodeGuard* _lastChild = nullptr;
        NodeGuard* _previous = nullptr;
        NodeGuard* _next = nullptr;
        bool _hasContent = false;
    };

    /// An element, open for as long as the guard lives; an automatic object as a rule.
    class ORV_RESMGT_API ElementGuard : public NodeGuard {
    public:
        /// @param name  written as given, as are the names of attributes.
        ElementGuard(XmlStreamer& document, const LiString& name);
        ElementGuard(ElementGuard& parent, const LiString& name);
        ~ElementGuard() noexcept(false) override;

        /// The value's `"&'<>` are escaped; line ends and tabs are not, and readers make them spaces.
        /// @throws XmlEx::ExSyntaxError  for any attribute once there is content.
        void addAttribute(const char* name, const char* value);
        void addAttribute(const char* name, const LiString& value);
        void addAttribute(const char* name, int value);
        void addAttribute(const char* name, unsigned value);
        void addAttribute(const char* name, long value);
        void addAttribute(const char* name, unsigned long value);
        void addAttribute(const char* name, long long value);
        void addAttribute(const char* name, unsigned long long value);
        void addAttribute(const char* name, double value);

        /// The text exactly as given: what is special in XML must be escaped already.
        void addTextData(const char* text);
        void addTextData(const LiString& text) { addTextData(text.getChars()); }

        /// "<![CDATA[", the text and "]]". There is no final ">": the readers of these files expect
        /// it so. For other readers begin the next text with ">".
        void addCharacterData(const char* text);
        void addCharacterData(const LiString& text) { addCharacterData(text.getChars()); }

    private:
        const LiString _name;

        void setContent(XmlOutput& output) override;
        void close(bool hadContent);
        void checkStartTagIsOpen(const char* attribute) const;

        template <class T>
        void addNumber(const char* name, T value);
    };

private:
    NodeGuard _root;
};

}  // namespace Orv

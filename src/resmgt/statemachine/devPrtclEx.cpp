#include "devPrtclEx.h"

namespace Orv {

namespace {

const char* orUnknown(const char* name) {
    return name != nullptr ? name : "<unknown>";
}

}  // namespace

DevPrtclEx::DevPrtclEx(const char* file, int line, const char* reason, const LiString& subject)
    : ExBase(file, line), std::logic_error(""), _subject(subject) {
    setReason(reason);
}

const char* DevPrtclEx::what() const noexcept {
    return getReason();
}

DevPrtclEx::ExNameNotUnique::ExNameNotUnique(const char* file, int line, const LiString& subject)
    : ExConcrete(file, line, "Not a unique name.", subject) {}

DevPrtclEx::ExNameNotRegistered::ExNameNotRegistered(const char* file, int line,
                                                     const LiString& subject)
    : ExConcrete(file, line, "Device name not found in the registry.", subject) {}

DevPrtclEx::ExMDStdAddStream::ExMDStdAddStream(const char* file, int line)
    : ExConcrete(file, line, "Attempt to add stream after iterator created.") {}

// The name has a closing quotation mark and no opening one: programs may look for this very text.
DevPrtclEx::ExMDPropertyIllegalOp::ExMDPropertyIllegalOp(const char* file, int line,
                                                         const char* operation,
                                                         const char* property)
    : ExConcrete(file, line, "\"") {
    appendReason(orUnknown(operation));
    appendReason("\" is not available for property ");
    appendReason(orUnknown(property));
    appendReason("\".");
}

DevPrtclEx::ExMDPropertyOutOfRange::ExMDPropertyOutOfRange(const char* file, int line,
                                                           const char* property, const char* value,
                                                           const char* range)
    : ExConcrete(file, line, "Value ") {
    appendReason(value);
    appendReason(" is out of range for property ");
    appendReason(orUnknown(property));
    appendReason(": ");
    appendReason(range);
    appendReason(".");
}

DevPrtclEx::ExMDStdPropertiesReadUnavail::ExMDStdPropertiesReadUnavail(const char* file, int line,
                                                                       const char* protocol,
                                                                       const char* what)
    : ExConcrete(file, line, "Read-only access to ") {
    appendReason(orUnknown(protocol));
    appendReason(" ");
    appendReason(orUnknown(what));
    appendReason(" forbidden while property builders are active.");
}

DevPrtclEx::ExMDStdPropertiesWriteUnavail::ExMDStdPropertiesWriteUnavail(const char* file, int line,
                                                                         const char* protocol)
    : ExConcrete(file, line, "Read-write access to ") {
    appendReason(orUnknown(protocol));
    appendReason(" properties forbidden after read-only access has started.");
}

DevPrtclEx::ExMDStdPropertyGet::ExMDStdPropertyGet(const char* file, int line, const char* property)
    : ExConcrete(file, line, "Error while getting the value for ") {
    appendReason(orUnknown(property));
}

DevPrtclEx::ExMDStdPropertySet::ExMDStdPropertySet(const char* file, int line, const char* property)
    : ExConcrete(file, line, "Error while setting the value for ") {
    appendReason(orUnknown(property));
}

DevPrtclEx::ExMDStdPropertySetBuilderPop::ExMDStdPropertySetBuilderPop(const char* file, int line)
    : ExConcrete(file, line, "Trying to pop the builder's property stack when it is empty.") {}

DevPrtclEx::ExMDStdFifoClosed::ExMDStdFifoClosed(const char* file, int line)
    : ExConcrete(file, line, "Device request queue is closed.") {}

}  // namespace Orv

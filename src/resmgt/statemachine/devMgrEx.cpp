#include "devMgrEx.h"

namespace Orv {

namespace {

const char* orElse(const char* text, const char* otherwise) {
    return text != nullptr ? text : otherwise;
}

}  // namespace

DevMgrEx::DevMgrEx(const char* file, int line, const char* reason, const LiString& subject)
    : ExBase(file, line), std::logic_error(""), _subject(subject) {
    setReason(reason);
}

const char* DevMgrEx::what() const noexcept {
    return getReason();
}

DevMgrEx::NameNotUnique::NameNotUnique(const char* file, int line, const LiString& subject)
    : ExConcrete(file, line, "Not a unique name.", subject) {}

DevMgrEx::NameNotRegistered::NameNotRegistered(const char* file, int line, const LiString& subject)
    : ExConcrete(file, line, "Not a registered object.", subject) {}

DevMgrEx::NameNotFound::NameNotFound(const char* file, int line, const LiString& subject)
    : ExConcrete(file, line, "Named device not found.", subject) {}

DevMgrEx::ConfigSyntaxError::ConfigSyntaxError(const char* file, int line, const char* text)
    : ExConcrete(file, line, orElse(text, "Configuration string Syntax error.")) {}

DevMgrEx::BadMDPrtclImp::BadMDPrtclImp(const char* file, int line, const LiString& subject)
    : ExConcrete(file, line, "Managed device protocol not implemented.", subject) {}

DevMgrEx::SMExecutionError::SMExecutionError(const char* file, int line, const LiString& subject)
    : ExConcrete(file, line, "State machine error condition.", subject) {}

DevMgrEx::SMDomainError::SMDomainError(const char* file, int line)
    : ExConcrete(file, line, "State machine domain error.") {}

DevMgrEx::SMBadImp::SMBadImp(const char* file, int line)
    : ExConcrete(file, line, "State machine bad implementation.") {}

DevMgrEx::SMBadTransitionImp::SMBadTransitionImp(const char* file, int line)
    : ExConcrete(file, line, "Bad transition implementation.") {}

DevMgrEx::PropertySyntaxError::PropertySyntaxError(const char* file, int line, const char* text)
    : ExConcrete(file, line, orElse(text, "Property string syntax error.")) {}

DevMgrEx::PropertyInvalidType::PropertyInvalidType(const char* file, int line, const char* property)
    : ExConcrete(file, line, "Illegal type converion of property ") {
    appendReason(orElse(property, "<unknown>"));
}

DevMgrEx::StreamNotAvailable::StreamNotAvailable(const char* file, int line, const char* text)
    : ExConcrete(file, line, orElse(text, "")) {}

DevMgrEx::StreamsNotCompatible::StreamsNotCompatible(const char* file, int line, const char* text)
    : ExConcrete(file, line, orElse(text, "")) {}

DevMgrEx::ThreadEnded::ThreadEnded(const char* file, int line)
    : ExConcrete(file, line, "Manager thread has ended.") {}

}  // namespace Orv

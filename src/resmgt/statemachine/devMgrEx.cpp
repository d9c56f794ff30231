#include "devMgrEx.h"

namespace Orv {

namespace {

const char* orElse(const char* text, const char* otherwise) {
    return text != nullptr ? text : otherwise;
}

}  // namespace

DevMgrEx::DevMgrEx(const char* file, int line, const char* reason)
    : ExBase(file, line), std::logic_error("") {
    setReason(reason);
}

const char* DevMgrEx::what() const noexcept {
    return getReason();
}

DevMgrEx::NameNotUnique::NameNotUnique(const char* file, int line)
    : ExConcrete(file, line, "Not a unique name.") {}

DevMgrEx::NameNotRegistered::NameNotRegistered(const char* file, int line)
    : ExConcrete(file, line, "Not a registered object.") {}

DevMgrEx::NameNotFound::NameNotFound(const char* file, int line)
    : ExConcrete(file, line, "Named device not found.") {}

DevMgrEx::ConfigSyntaxError::ConfigSyntaxError(const char* file, int line, const char* text)
    : ExConcrete(file, line, orElse(text, "Configuration string Syntax error.")) {}

DevMgrEx::BadMDPrtclImp::BadMDPrtclImp(const char* file, int line)
    : ExConcrete(file, line, "Managed device protocol not implemented.") {}

DevMgrEx::SMExecutionError::SMExecutionError(const char* file, int line)
    : ExConcrete(file, line, "State machine error condition.") {}

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

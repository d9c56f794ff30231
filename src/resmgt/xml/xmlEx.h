#pragma once

#include <stdexcept>
#include <string_view>

#include "exBase.h"
#include "resmgtApi.h"

namespace Orv {

/// Errors of XML.
class ORV_RESMGT_API XmlEx : public ExBase {
public:
    class ExSyntaxError;

protected:
    using ExBase::ExBase;
};

/// An attribute for an element that has content already, so that its start tag is closed.
class ORV_RESMGT_API XmlEx::ExSyntaxError
    : public ExConcrete<ExSyntaxError, XmlEx, std::logic_error> {
public:
    ExSyntaxError(const char* file, int line, std::string_view attribute);
};

}  // namespace Orv

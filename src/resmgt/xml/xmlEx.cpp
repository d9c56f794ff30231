#include "xmlEx.h"

#include <string>

namespace Orv {

XmlEx::ExSyntaxError::ExSyntaxError(const char* file, int line, std::string_view attribute)
    : ExConcrete(file, line) {
    setReason(std::string("Attribute \"")
                  .append(attribute)
                  .append("\" comes after the content of its element."));
}

}  // namespace Orv

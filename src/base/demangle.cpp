#include "demangle.h"

#include <cxxabi.h>

#include "arrayPtr.h"

namespace Orv {

std::string demangle(const std::type_info& type) {
    int status = 0;
    const ArrayPtr<char> name(abi::__cxa_demangle(type.name(), nullptr, nullptr, &status));
    return name.isNull() ? type.name() : name.get();
}

}  // namespace Orv

#include "osError.h"

#include "formatText.h"

namespace Orv {

std::string OsError::describe(int code) {
    return formatText("error %d (%s)", code, getText(code).c_str());
}

}  // namespace Orv

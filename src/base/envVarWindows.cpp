#include <cstdlib>
#include <windows.h>

#include "envVar.h"
#include "exSysError.h"
#include "osError.h"
#include "sourceFile.h"

namespace Orv {

// The system's environment is the one read: the program may have started with variables that the
// C runtime cannot hold, and libraries with another C runtime change only the system's.

std::optional<std::string> EnvVar::read(const char* name) {
    std::string text(64, '\0');
    for (;;) {
        ::SetLastError(ERROR_SUCCESS);  // an empty text has length 0, as a missing variable
        const DWORD length =
            ::GetEnvironmentVariableA(name, text.data(), static_cast<DWORD>(text.size()));
        if (length == 0 && ::GetLastError() != ERROR_SUCCESS) return std::nullopt;
        const bool isWhole = length < text.size();
        text.resize(length);
        if (isWhole) return text;
    }
}

void EnvVar::write(const char* name, const char* value) {
    const char* const kept = *value == '\0' ? nullptr : value;
    const std::optional<std::string> before = read(name);
    if (!::SetEnvironmentVariableA(name, kept) &&
        !(kept == nullptr && ::GetLastError() == ERROR_ENVVAR_NOT_FOUND)) {
        throw ExSysError(ORV_FILE, __LINE__, "SetEnvironmentVariable", OsError::getLast());
    }
    if (::_putenv_s(name, value) != 0) {
        ::SetEnvironmentVariableA(name, before ? before->c_str() : nullptr);
        throw ExSysError(ORV_FILE, __LINE__, "_putenv_s", ERROR_NOT_ENOUGH_MEMORY);
    }
}

}  // namespace Orv

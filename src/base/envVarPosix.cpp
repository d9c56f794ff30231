#include <cerrno>
#include <stdlib.h>

#include "envVar.h"
#include "exSysError.h"
#include "sourceFile.h"

namespace Orv {

// NOLINTBEGIN(concurrency-mt-unsafe): EnvVar calls these under its lock.

std::optional<std::string> EnvVar::read(const char* name) {
    const char* const text = ::getenv(name);
    return text == nullptr ? std::nullopt : std::optional<std::string>(text);
}

void EnvVar::write(const char* name, const char* value) {
    const int result = *value == '\0' ? ::unsetenv(name) : ::setenv(name, value, 1);
    if (result != 0) throw ExSysError(ORV_FILE, __LINE__, "setenv", errno);
}

// NOLINTEND(concurrency-mt-unsafe)

}  // namespace Orv

#include "mbEvent.h"

namespace Orv {

const char* getMbEventText(MbEvent event) noexcept {
    static constexpr const char* TEXTS[NB_MB_EVENTS] = {
        "rdlock()", "wrlock()", "wrdup()", "prefetch()", "asyncSync()",        "sync()",
        "unlock()", "unload()", "free()",  "destroy()",  "asyncOpSucceeded()", "asyncOpFailed()"};
    return TEXTS[static_cast<std::size_t>(event)];
}

}  // namespace Orv

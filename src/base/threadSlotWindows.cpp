#include <memory>
#include <windows.h>

#include "assertions.h"
#include "osError.h"
#include "threadSlot.h"

namespace Orv {

// The pointers stand on the heap. A slot of thread-local storage leads to them, and after the end
// to those that all threads have then; one of fiber-local storage has a callback for the end.

struct ThreadSlot::Platform {
    DWORD values;
    DWORD end;

    static inline Values ended{.pointers = {}, .hasEnded = true};

    static const Platform& get() {
        static const Platform platform = [] {
            const Platform made{::TlsAlloc(), ::FlsAlloc(notice)};
            ORV_ASSERT_SYS(made.values != TLS_OUT_OF_INDEXES,
                           "(values = ::TlsAlloc()) != TLS_OUT_OF_INDEXES", OsError::getLast());
            ORV_ASSERT_SYS(made.end != FLS_OUT_OF_INDEXES,
                           "(end = ::FlsAlloc( notice )) != FLS_OUT_OF_INDEXES",
                           OsError::getLast());
            return made;
        }();
        return platform;
    }

    static void CALLBACK notice(void* pointers) {
        if (pointers == nullptr) return;
        const std::unique_ptr<Values> values(static_cast<Values*>(pointers));
        tellAll(*values);
        ::TlsSetValue(get().values, &ended);
    }
};

ThreadSlot::Values* ThreadSlot::find() noexcept {
    const DWORD error = ::GetLastError();  // TlsGetValue() clears it, and a caller may want it
    auto* const values = static_cast<Values*>(::TlsGetValue(Platform::get().values));
    ::SetLastError(error);
    return values;
}

ThreadSlot::Values& ThreadSlot::watch() {
    auto values = std::make_unique<Values>();
    const Platform& platform = Platform::get();
    ORV_ASSERT_SYS(::TlsSetValue(platform.values, values.get()), "::TlsSetValue( values, ... )",
                   OsError::getLast());
    if (!::FlsSetValue(platform.end, values.get())) {
        const int error = OsError::getLast();
        ::TlsSetValue(platform.values, nullptr);
        ORV_ASSERT_SYS(false, "::FlsSetValue( end, values )", error);
    }
    return *values.release();
}

}  // namespace Orv

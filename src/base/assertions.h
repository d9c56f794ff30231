#pragma once

#include "assertionEx.h"
#include "sourceFile.h"

namespace Orv {

/// Reports broken invariants and OS calls that must not fail, as exceptions.
///
/// Code asserts with the macros below. A destructor that asserts is `noexcept(false)` and uses
/// ORV_ASSERT_IN_DESTRUCTOR, which traces where a second exception would end the program.
class ORV_BASE_API Assertions {
public:
    [[noreturn]] static void throwAssertionFailed(const char* file, int line,
                                                  const char* expression);
    [[noreturn]] static void throwSysAssertionFailed(const char* file, int line,
                                                     const char* expression, int osError);
    [[noreturn]] static void throwProgramAborted(const char* file, int line,
                                                 const char* explanation);

    /// For destructors: as the two above, but while the stack unwinds, traces and returns.
    static void reportAssertionFailed(const char* file, int line, const char* expression);
    static void reportSysAssertionFailed(const char* file, int line, const char* expression,
                                         int osError);

    /// Traces the exception being handled, where nobody is left to catch it. Call it in a handler.
    /// @param where  what was going on, such as "destroying an object".
    static void traceCurrentException(const char* where) noexcept;
};

}  // namespace Orv

/// Throws AssertionFailed unless the condition holds; the text is the condition's own.
#define ORV_ASSERT(condition) ORV_ASSERT_TEXT(condition, #condition)

/// The same with a text of its own.
#define ORV_ASSERT_TEXT(condition, text) \
    ((condition) ? void() : Orv::Assertions::throwAssertionFailed(ORV_FILE, __LINE__, text))

/// Throws SysAssertionFailed with the given OS error unless the condition holds.
#define ORV_ASSERT_SYS(condition, text, osError) \
    ((condition) ? void()                        \
                 : Orv::Assertions::throwSysAssertionFailed(ORV_FILE, __LINE__, text, osError))

/// ORV_ASSERT for a destructor.
#define ORV_ASSERT_IN_DESTRUCTOR(condition) ORV_ASSERT_IN_DESTRUCTOR_TEXT(condition, #condition)

/// The same with a text of its own.
#define ORV_ASSERT_IN_DESTRUCTOR_TEXT(condition, text) \
    ((condition) ? void() : Orv::Assertions::reportAssertionFailed(ORV_FILE, __LINE__, text))

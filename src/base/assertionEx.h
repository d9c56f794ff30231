#pragma once

#include <stdexcept>

#include "exBase.h"

namespace Orv {

/// A broken invariant or precondition, or an OS call that must not fail and did.
///
/// The reason names place, expression and OS error; each can be read on its own, too.
class ORV_BASE_API AssertionEx : public ExBase, public std::logic_error {
public:
    const char* what() const noexcept override;

    const char* getExpression() const noexcept;           ///< The asserted expression's text.
    int getOsError() const noexcept { return _osError; }  ///< 0 where there was none.

protected:
    AssertionEx(const char* file, int line, const char* expression, int osError);

private:
    std::shared_ptr<const std::string> _expression;
    int _osError;
};

/// A condition of the program does not hold.
class ORV_BASE_API AssertionFailed : public ExConcrete<AssertionFailed, AssertionEx> {
public:
    AssertionFailed(const char* file, int line, const char* expression);
};

/// A call of the operating system that must not fail has failed.
class ORV_BASE_API SysAssertionFailed : public ExConcrete<SysAssertionFailed, AssertionEx> {
public:
    SysAssertionFailed(const char* file, int line, const char* expression, int osError);
};

/// A place that a correct program never reaches was reached.
class ORV_BASE_API ProgramAborted : public ExConcrete<ProgramAborted, AssertionEx> {
public:
    ProgramAborted(const char* file, int line, const char* explanation);
};

}  // namespace Orv

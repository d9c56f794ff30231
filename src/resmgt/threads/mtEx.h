#pragma once

#include <exception>
#include <stdexcept>
#include <string>

#include "exBase.h"
#include "objPtr.h"
#include "resmgtApi.h"

namespace Orv {

/// Errors of threads.
class ORV_RESMGT_API MtEx : public ExBase, public std::runtime_error {
public:
    class ExRealTimeNotEnabled;
    class ExThrownException;
    class ExStdThrownException;
    class ExNoContent;
    class ExPoolStopped;

    const char* what() const noexcept override;

    /// Throws what the body of a thread threw, as one of the two classes for that.
    [[noreturn]] static void throwThrown(const char* file, int line, const char* thread,
                                         const std::exception_ptr& thrown);

    /// What an exception says, or its type.
    static std::string describe(const std::exception_ptr& thrown);

protected:
    MtEx(const char* file, int line);
};

/// The system refuses real time: "Failure to enable real-time: <the system's explanation>."
class ORV_RESMGT_API MtEx::ExRealTimeNotEnabled : public ExConcrete<ExRealTimeNotEnabled, MtEx> {
public:
    ExRealTimeNotEnabled(const char* file, int line, const std::string& explanation);
};

/// What a thread's body threw, told to the thread that joins it: an exception of the system.
class ORV_RESMGT_API MtEx::ExThrownException : public ExConcrete<ExThrownException, MtEx> {
public:
    /// Keeps a clone of @p thrown, whose reason becomes part of this one's.
    ExThrownException(const char* file, int line, const std::string& thread, const ExBase& thrown);
    ExThrownException(const ExThrownException&);  ///< Clones what was thrown.

    const ExBase& getThrown() const noexcept { return *_thrown; }

private:
    ObjPtr<ExBase> _thrown;  // never null
};

/// The same for any other exception: of the standard library, or of a type of its own.
class ORV_RESMGT_API MtEx::ExStdThrownException : public ExConcrete<ExStdThrownException, MtEx> {
public:
    /// @param description  what the exception says, or its type.
    ExStdThrownException(const char* file, int line, const std::string& thread,
                         const std::string& description, std::exception_ptr thrown);

    /// The exception itself, for std::rethrow_exception(); never null.
    const std::exception_ptr& getThrown() const noexcept { return _thrown; }

private:
    std::exception_ptr _thrown;
};

/// A slot of thread data made no value.
class ORV_RESMGT_API MtEx::ExNoContent : public ExConcrete<ExNoContent, MtEx> {
public:
    ExNoContent(const char* file, int line, const char* slot);
};

/// A pool takes no tasks: it was not started, or is being stopped.
class ORV_RESMGT_API MtEx::ExPoolStopped : public ExConcrete<ExPoolStopped, MtEx> {
public:
    ExPoolStopped(const char* file, int line, const char* pool);
};

}  // namespace Orv

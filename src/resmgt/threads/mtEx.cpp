#include "mtEx.h"

#include "currentException.h"

namespace Orv {

MtEx::MtEx(const char* file, int line) : ExBase(file, line), std::runtime_error("") {}

const char* MtEx::what() const noexcept {
    return getReason();
}

void MtEx::throwThrown(const char* file, int line, const char* thread,
                       const std::exception_ptr& thrown) {
    try {
        std::rethrow_exception(thrown);
    } catch (const ExBase& exception) {
        throw ExThrownException(file, line, thread, exception);
    } catch (...) {
        throw ExStdThrownException(file, line, thread, describeCurrentException(), thrown);
    }
}

std::string MtEx::describe(const std::exception_ptr& thrown) {
    try {
        std::rethrow_exception(thrown);
    } catch (...) {
        return describeCurrentException();
    }
}

MtEx::ExRealTimeNotEnabled::ExRealTimeNotEnabled(const char* file, int line,
                                                 const std::string& explanation)
    : ExConcrete(file, line) {
    setReason("Failure to enable real-time: " + explanation + ".");
}

MtEx::ExThrownException::ExThrownException(const char* file, int line, const std::string& thread,
                                           const ExBase& thrown)
    : ExConcrete(file, line), _thrown(thrown.clone()) {
    setReason("Thread \"" + thread + "\" ended with an exception: " + thrown.what());
}

MtEx::ExThrownException::ExThrownException(const ExThrownException& other)
    : ExConcrete(other), _thrown(other._thrown->clone()) {}

MtEx::ExStdThrownException::ExStdThrownException(const char* file, int line,
                                                 const std::string& thread,
                                                 const std::string& description,
                                                 std::exception_ptr thrown)
    : ExConcrete(file, line), _thrown(std::move(thrown)) {
    setReason("Thread \"" + thread + "\" ended with an exception: " + description);
}

MtEx::ExNoContent::ExNoContent(const char* file, int line, const char* slot)
    : ExConcrete(file, line) {
    setReason(std::string("Thread data \"") + slot + "\" has no content.");
}

MtEx::ExPoolStopped::ExPoolStopped(const char* file, int line, const char* pool)
    : ExConcrete(file, line) {
    setReason(std::string("Thread pool \"") + pool + "\" is stopped.");
}

}  // namespace Orv

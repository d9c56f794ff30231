#include "devMDStdStreamActiveSource.h"

#include <cxxabi.h>
#include <utility>

#include "assertions.h"
#include "devMDStdStreamNewsPrivate.h"

namespace Orv {

using Elem = DevMDStreamElem;

namespace {

/// To a sink that has thrown: its device may be waiting for the stream to end.
void pushFailed(const DevMDStdStreamActiveEnd<DevMDStreamPassiveSink>::Use& sink) {
    try {
        sink->push(DevMDStdStreamNews::create(Elem::FAILED));
    } catch (const abi::__forced_unwind&) {
        throw;
    } catch (...) {
        // What it has thrown before, or its device has gone.
    }
}

}  // namespace

DevMDStdStreamActiveSource::DevMDStdStreamActiveSource(const LiString& name,
                                                       const LiString& description)
    : _name(name), _description(description) {}

DevMDStdStreamActiveSource::~DevMDStdStreamActiveSource() noexcept(false) = default;

void DevMDStdStreamActiveSource::start() {
    _isAvailable = false;
    _end.start();
}

void DevMDStdStreamActiveSource::stop() {
    _end.stop();
    _isAvailable = true;
}

bool DevMDStdStreamActiveSource::push(ObjPtr<Elem> elem) {
    return pushAndJudge(std::move(elem), nullptr);
}

void DevMDStdStreamActiveSource::fail(std::exception_ptr failure) {
    pushAndJudge(DevMDStdStreamNews::create(Elem::FAILED), std::move(failure));
}

bool DevMDStdStreamActiveSource::pushAndJudge(ObjPtr<Elem> elem, std::exception_ptr failure) {
    const State state = DevMDStdStreamNews::stateAfter(elem->getEv());
    {
        const DevMDStdStreamActiveEnd<DevMDStreamPassiveSink>::Use sink(_end);
        if (!sink.isPossible()) return false;
        if (state != State::RUNNING) _end.end(state, std::move(failure));
        try {
            sink->push(std::move(elem));
        } catch (...) {
            // A sink that has failed has told why.
            if (sink->getState() != State::FAILED) {
                Assertions::traceCurrentException(
                    DevMDStdStreamNews::describe("pushing into", _name).c_str());
            }
            _end.end(State::FAILED, std::current_exception());
            if (state == State::RUNNING) pushFailed(sink);
        }
    }
    const State after = _end.getState();
    if (after == State::RUNNING) return true;
    _end.tellEnd();
    return false;
}

}  // namespace Orv

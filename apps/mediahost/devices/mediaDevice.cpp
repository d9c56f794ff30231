#include "mediaDevice.h"

#include <algorithm>

namespace MediaHost {

TextValue toTextValue(const std::string& text) {
    TextValue value;
    value.assign(text.begin(), text.end());
    return value;
}

std::string toText(const TextValue& value) {
    return std::string(value.begin(), value.end());
}

MediaDevice::MediaDevice(const Orv::LiString& name, HostContext& context)
    : DevMDStdSyncSeqDevice(name, QUEUE_CAPACITY), _context(context), _text(name.getText()) {
    setStackSize(1 << 20);
}

Orv::RCShdPtr<MediaDevice::Source> MediaDevice::addOutput(const Orv::LiString& name,
                                                          const Orv::LiString& description) {
    Orv::RCShdPtr<Source> source(new Source(name, description));
    addStream(source);
    return source;
}

bool MediaDevice::isInputOpen(std::size_t input) const {
    return !_inputs[input].hasEnded &&
           _inputs[input].sink->getState() != Orv::DevMDStream::State::FREE;
}

bool MediaDevice::isAnyInputOpen() const {
    for (std::size_t i = 0; i < _inputs.size(); ++i) {
        if (isInputOpen(i)) return true;
    }
    return false;
}

void MediaDevice::take(std::size_t input, Orv::ObjPtr<Elem> elem,
                       const std::function<void(const Orv::RCShdPtr<Orv::DevMDStreamBuf>&)>& work) {
    try {
        if (elem->isTerminal()) {
            _inputs[input].hasEnded = true;
            inputEnded(input);
            if (!isAnyInputOpen()) finishOnce(!_context.hasFailed());
        } else if (elem->getEv() == Elem::DATA && !_isFinished) {
            work(elem->getBuf());
        }
    } catch (...) {
        _context.reportFailure(_text, std::current_exception());
        finishOnce(false);
    }
}

void MediaDevice::finishOnce(bool isWhole) {
    if (!_isFinished) {
        _isFinished = true;
        finish(isWhole);
    }
    if (!isAnyInputOpen()) _stopping.done();
    _context.reportEnd(_text);
}

void MediaDevice::start(const Orv::DevMDSyncSeqSignals& signals) {
    if (isAnyInputOpen()) _context.expectEnd(_text);
    signals.ready();
}

// What is still on its way comes first; the end of the last input then completes the stop.
void MediaDevice::stop(Orv::DevMDSyncSeqRequest& request) {
    if (isAnyInputOpen()) {
        _stopping = request.postpone();
        return;
    }
    try {
        finishOnce(!_context.hasFailed());
    } catch (...) {
        _context.reportFailure(_text, std::current_exception());
    }
}

// A show that was given up leaves nothing half done that looks whole.
void MediaDevice::abort(Orv::DevMDSyncSeqRequest&) {
    finishOnce(false);
    _stopping.done();
}

void MediaDevice::close() {
    _stopping = Orv::DevMDSyncSeqDone();
}

}  // namespace MediaHost

#include "mediaDevice.h"

#include <utility>

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

void MediaDevice::take(const Orv::RCShdPtr<Orv::DevMDStreamBuf>& buf, const Work& work) {
    if (_isFinished) return;
    try {
        work(buf);
    } catch (...) {
        _context.reportFailure(_text, std::current_exception());
        finishOnce(false);
    }
}

void MediaDevice::finishOnce(bool isWhole) {
    if (std::exchange(_isFinished, true)) return;
    try {
        finish(isWhole);
    } catch (...) {
        _context.reportFailure(_text, std::current_exception());
    }
    _context.reportEnd(_text);
}

void MediaDevice::inputsEnded() {
    finishOnce(!_context.hasFailed());
}

void MediaDevice::start(const Orv::DevMDSyncSeqSignals& signals) {
    if (hasOpenInputs()) _context.expectEnd(_text);
    signals.ready();
}

void MediaDevice::stop(Orv::DevMDSyncSeqRequest& request) {
    stopWhenInputsEnd(request);
    if (!hasOpenInputs()) inputsEnded();
}

// A show that was given up leaves nothing half done that looks whole.
void MediaDevice::abort(Orv::DevMDSyncSeqRequest&) {
    finishOnce(false);
}

}  // namespace MediaHost

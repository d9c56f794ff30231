#pragma once

#include <functional>
#include <orv/devMDStdStreamActiveSource.h>
#include <orv/devMDStdSyncSeqDevice.h>
#include <string>

#include "hostContext.h"
#include "mediaError.h"
#include "streamBufs.h"

namespace MediaHost {

/// A text as a property's value, for which there is no type: its characters.
using TextValue = Orv::Vector<signed char>;
TextValue toTextValue(const std::string& text);
std::string toText(const TextValue& value);

/// What the devices of the host have in common: inputs, outputs that hand on what comes in, failures
/// that are told to the host, and a sequence that stops when all inputs have ended.
///
/// - Threads: all functions of a device run on its own.
class MediaDevice : public Orv::DevMDStdSyncSeqDevice {
protected:
    using Elem = Orv::DevMDStreamElem;
    using Source = Orv::DevMDStdStreamActiveSource;
    using Sink = Orv::DevMDStdStreamFunctionSink;

    static constexpr int QUEUE_CAPACITY = 4;  // requests; pictures in it are locked in memory

    MediaDevice(const Orv::LiString& name, HostContext& context);

    HostContext& getContext() const { return _context; }

    /// A sink whose buffers of the class @p Buf go to @p take. What that throws is the failure of
    /// the device, which then discards what still comes.
    template <class Buf, class Take>
    Orv::RCShdPtr<Sink> addInput(const Orv::LiString& name, const Orv::LiString& description,
                                 Take take);

    /// A source for the device's thread.
    Orv::RCShdPtr<Source> addOutput(const Orv::LiString& name, const Orv::LiString& description);

    /// Nothing more comes in; called once. Ends what goes out.
    /// @param isWhole  all that was to come has come: files are finished; else they are left away.
    virtual void finish(bool /*isWhole*/) {}

    void start(const Orv::DevMDSyncSeqSignals& signals) override;
    void stop(Orv::DevMDSyncSeqRequest& request) override;
    void abort(Orv::DevMDSyncSeqRequest& request) override;
    void inputsEnded() override;

private:
    using Work = std::function<void(const Orv::RCShdPtr<Orv::DevMDStreamBuf>&)>;

    HostContext& _context;
    const std::string _text;  // the name
    bool _isFinished = false;

    void take(const Orv::RCShdPtr<Orv::DevMDStreamBuf>& buf, const Work& work);
    void finishOnce(bool isWhole);
};

template <class Buf, class Take>
Orv::RCShdPtr<MediaDevice::Sink> MediaDevice::addInput(const Orv::LiString& name,
                                                       const Orv::LiString& description,
                                                       Take take) {
    const Work work = [take](const Orv::RCShdPtr<Orv::DevMDStreamBuf>& buf) {
        const auto ours = Orv::RCShdPtr<Buf>::dynamicCast(buf);
        if (ours.isNull()) throw MediaError("something else than was agreed came in");
        take(ours);
    };
    return addSink(name, description, [this, work](const Orv::ObjPtr<Elem>& elem) {
        if (elem->getEv() == Elem::DATA) this->take(elem->getBuf(), work);
    });
}

}  // namespace MediaHost

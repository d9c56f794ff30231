#pragma once

#include <orv/devMDStdStreamActiveSource.h>
#include <orv/devMDStdSyncSeqDevice.h>
#include <string>
#include <vector>

#include "hostContext.h"
#include "mediaError.h"
#include "streamBufs.h"

namespace MediaHost {

/// A text as a property's value, for which there is no type: its characters.
using TextValue = Orv::Vector<signed char>;
TextValue toTextValue(const std::string& text);
std::string toText(const TextValue& value);

/// What the devices of the host have in common: inputs that end, outputs that hand on what comes
/// in, failures that are told to the host, and a sequence that stops when all inputs have ended.
///
/// - Threads: all functions of a device run on its own.
class MediaDevice : public Orv::DevMDStdSyncSeqDevice {
protected:
    using Elem = Orv::DevMDStreamElem;
    using Source = Orv::DevMDStdStreamActiveSource;
    using Sink = Orv::DevMDStdStreamPassiveSink;

    static constexpr int QUEUE_CAPACITY = 4;  // requests; pictures in it are locked in memory

    MediaDevice(const Orv::LiString& name, HostContext& context);

    HostContext& getContext() const { return _context; }

    /// A sink whose buffers of the class @p Buf go to @p take. What that throws is the failure of
    /// the device, after which nothing more comes.
    template <class Buf, class Take>
    void addInput(const Orv::LiString& name, const Orv::LiString& description, Take take);

    /// A source for the device's thread.
    Orv::RCShdPtr<Source> addOutput(const Orv::LiString& name, const Orv::LiString& description);

    virtual void inputEnded(std::size_t /*input*/) {}  ///< In order of addition.

    /// Nothing more comes in; called once. Ends what goes out.
    /// @param isWhole  all that was to come has come: files are finished; else they are left away.
    virtual void finish(bool /*isWhole*/) {}

    bool isInputOpen(std::size_t input) const;  ///< Something may still come.

    void start(const Orv::DevMDSyncSeqSignals& signals) override;
    void stop(Orv::DevMDSyncSeqRequest& request) override;
    void abort(Orv::DevMDSyncSeqRequest& request) override;
    void close() override;

private:
    struct Input {
        Orv::RCShdPtr<Sink> sink;
        bool hasEnded = false;
    };

    HostContext& _context;
    const std::string _text;  // the name
    std::vector<Input> _inputs;
    Orv::DevMDSyncSeqDone _stopping;
    bool _isFinished = false;

    void take(std::size_t input, Orv::ObjPtr<Elem> elem,
              const std::function<void(const Orv::RCShdPtr<Orv::DevMDStreamBuf>&)>& work);
    bool isAnyInputOpen() const;
    void finishOnce(bool isWhole);
};

template <class Buf, class Take>
void MediaDevice::addInput(const Orv::LiString& name, const Orv::LiString& description, Take take) {
    const std::size_t input = _inputs.size();
    const auto work = [take](const Orv::RCShdPtr<Orv::DevMDStreamBuf>& buf) {
        const auto ours = Orv::RCShdPtr<Buf>::dynamicCast(buf);
        if (ours.isNull()) throw MediaError("something else than was agreed came in");
        take(ours);
    };
    _inputs.push_back({addSink(name, description, [this, input, work](Orv::ObjPtr<Elem> elem) {
        this->take(input, std::move(elem), work);
    })});
}

}  // namespace MediaHost

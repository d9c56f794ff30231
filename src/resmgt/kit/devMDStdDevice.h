#pragma once

#include <functional>
#include <vector>

#include "devMDStdAccessPrtcl.h"
#include "devMDStdFunctionPropertyFactory.h"
#include "devMDStdProperty.h"
#include "devMDStdPropertyPrtcl.h"
#include "devMDStdStreamFunctionSink.h"
#include "devMDStdStreamLoopSource.h"
#include "devMDStdStreamPassiveSource.h"
#include "devMDStdStreamPrtcl.h"

namespace Orv {

/// Base of an ordinary device: properties behind functions, streams, opening and closing. All
/// functions of the device run on its own thread, so what they use needs no lock.
///
/// Derive from it, and add properties and streams in the constructor, or in open() where only an
/// open device knows them.
///
/// - Threads: the adding functions until open() has returned; the rest says so itself.
class ORV_RESMGT_API DevMDStdDevice : public DevMDStdAccessPrtcl,
                                      public DevMDStdPropertyPrtcl,
                                      public DevMDStdStreamPrtcl {
public:
    static constexpr int STANDARD_CAPACITY = 25;

    /// @param capacity  of the queue, in requests; 0: unbounded.
    explicit DevMDStdDevice(const LiString& name, int capacity = STANDARD_CAPACITY);
    ~DevMDStdDevice() noexcept(false) override;

    const LiString& getName() const noexcept { return _name; }

    /// Runs @p work on the device's thread, after what is in the queue already. From any thread;
    /// waits for room, but not for the work.
    /// @throws DevPrtclEx::ExMDStdFifoClosed
    void post(std::function<void()> work);

protected:
    virtual void open() {}   ///< On the device's thread; what it throws, performOpen() throws.
    virtual void close() {}  ///< On the device's thread, as the last thing it does.

    /// Adds a property; what has no getter cannot be read, what has no setter not be written.
    /// @param path  its name, after the sets it is in: "channel1:eq:gain".
    /// @throws DevPrtclEx::ExNameNotUnique
    template <DevMDValue T>
    RCShdPtr<DevMDStdProperty<T>> addProperty(
        const LiString& path, const LiString& description,
        typename DevMDStdFunctionPropertyFactory<T>::Getter getter,
        typename DevMDStdFunctionPropertyFactory<T>::Setter setter = nullptr,
        RCShdPtr<DevMDPropertyDescriptor<T>> descriptor = nullptr);

    /// A sink that other devices push into; @p take sees each element. What it throws, the source's
    /// next push() throws; see DevMDStdStreamFunctionSink.
    RCShdPtr<DevMDStdStreamFunctionSink> addSink(
        const LiString& name, const LiString& description, DevMDStdStreamFunctionSink::Take take,
        DevMDStdStreamFunctionSink::IsCompatible isCompatible = nullptr);

    /// On the device's thread: of the sinks of addSink(), the last has seen its terminal element.
    virtual void inputsEnded() {}
    bool hasOpenInputs() const;  ///< May anything still come into them?

    /// A source that pushes: @p loop runs on a thread of its own while it is connected, after
    /// @p prepare, which connecting waits for; see DevMDStdStreamLoopSource.
    RCShdPtr<DevMDStdStreamLoopSource> addLoopSource(
        const LiString& name, const LiString& description, DevMDStdStreamLoopSource::Loop loop,
        DevMDStdStreamLoopSource::Loop prepare = nullptr, unsigned stackSize = 0);

    /// A source that others pull from, and into which the device puts what it has.
    RCShdPtr<DevMDStdStreamPassiveSource> addPassiveSource(
        const LiString& name, const LiString& description,
        int capacity = DevMDStdStreamPassiveSource::STANDARD_CAPACITY);

    const RCShdPtr<DevMDStdFifo>& getFifo() const noexcept { return _fifo; }

private:
    class AccessFactory;
    class Input;

    const LiString _name;
    const RCShdPtr<DevMDStdFifo> _fifo;
    std::vector<RCShdPtr<DevMDStdStreamFunctionSink>> _inputs;

    DevMDStdDevice(const LiString& name, const RCShdPtr<DevMDStdFifo>& fifo);
    virtual void noteInputsEnded() { inputsEnded(); }
    void addToSet(const LiString& path, RCShdPtr<DevMDPropertyAny> property);
    static LiString getLastName(const LiString& path);
};

template <DevMDValue T>
RCShdPtr<DevMDStdProperty<T>> DevMDStdDevice::addProperty(
    const LiString& path, const LiString& description,
    typename DevMDStdFunctionPropertyFactory<T>::Getter getter,
    typename DevMDStdFunctionPropertyFactory<T>::Setter setter,
    RCShdPtr<DevMDPropertyDescriptor<T>> descriptor) {
    const unsigned attributes =
        (getter ? DevMDPropertyAny::READABLE : 0) | (setter ? DevMDPropertyAny::WRITABLE : 0);
    ObjPtr<DevMDStdPropertyANOFactory<T>> factory(
        new DevMDStdFunctionPropertyFactory<T>(std::move(getter), std::move(setter)));
    RCShdPtr<DevMDStdProperty<T>> property(new DevMDStdProperty<T>(getLastName(path), description,
                                                                   attributes, std::move(factory),
                                                                   _fifo, std::move(descriptor)));
    addToSet(path, property);
    return property;
}

}  // namespace Orv

#pragma once

#include <functional>
#include <utility>

#include "devMDStdANO.h"
#include "devMDStdPropertyANOFactory.h"
#include "rcBase.h"
#include "rcShdPtr.h"

namespace Orv {

/// A property behind two functions, which the device's own thread calls: one at a time, so they
/// need no lock for what only they use. A getter that throws fails the get.
template <DevMDValue T>
class ORV_HEADER_API DevMDStdFunctionPropertyFactory : public DevMDStdPropertyANOFactory<T> {
public:
    using Getter = std::function<T()>;
    using Setter = std::function<void(const T&)>;

    /// Either may be empty if the property's attributes forbid its use.
    DevMDStdFunctionPropertyFactory(Getter getter, Setter setter)
        : _functions(new Functions{std::move(getter), std::move(setter)}) {}

    ObjPtr<DevANO> createSetANO(LiUuid, const T& value) override {
        return ObjPtr<DevANO>(new SetANO(_functions, value));
    }
    ObjPtr<DevANO> createGetANO(LiUuid, T& destination, bool& success) override {
        return ObjPtr<DevANO>(new GetANO(_functions, destination, success));
    }

private:
    // Shared with the requests, which may outlive the property.
    struct Functions : RCBase<LkCounter<long>> {
        const Getter getter;
        const Setter setter;
        Functions(Getter get, Setter set) : getter(std::move(get)), setter(std::move(set)) {}
    };
    const RCShdPtr<const Functions> _functions;

    class SetANO : public DevMDStdANO {
    public:
        SetANO(const RCShdPtr<const Functions>& functions, const T& value)
            : _functions(functions), _value(value) {}
        void performExecute() override { _functions->setter(_value); }

    private:
        const RCShdPtr<const Functions> _functions;
        const T _value;
    };

    class GetANO : public DevMDStdANO {
    public:
        GetANO(const RCShdPtr<const Functions>& functions, T& destination, bool& success)
            : _functions(functions), _destination(destination), _success(success) {}
        void performExecute() override {
            _success = false;
            _destination = _functions->getter();
            _success = true;
        }

    private:
        const RCShdPtr<const Functions> _functions;
        T& _destination;
        bool& _success;
    };
};

}  // namespace Orv

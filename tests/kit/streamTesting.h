#pragma once

#include <exception>
#include <string>
#include <vector>

#include "kitTesting.h"

namespace Orv {

using Elem = DevMDStreamElem;
using State = DevMDStream::State;

class NumberBuf : public DevMDStreamBuf {
public:
    explicit NumberBuf(int n) : number(n) {}
    const int number;
};

inline ObjPtr<Elem> numberElem(int number) {
    return ObjPtr<Elem>(new Elem(RCShdPtr<DevMDStreamBuf>(new NumberBuf(number)), Elem::DATA));
}

inline ObjPtr<Elem> newsElem(Elem::Ev ev) {
    return ObjPtr<Elem>(new Elem(nullptr, ev));
}

/// A number, or minus one less than what the element tells.
inline int codeOf(const Elem& elem) {
    const auto* const buf = dynamic_cast<const NumberBuf*>(elem.getBuf().get());
    return buf != nullptr ? buf->number : -elem.getEv();
}

/// A device with a sink that notes what it is given.
struct SinkDevice {
    std::vector<int> seen;  // of the device's thread, and of the test when that is closed
    TestCounter nbSeen;
    RCShdPtr<DevMDStdStreamPassiveSink> sink;
    RCShdPtr<TestDevice> device;  // closed before the rest goes

    explicit SinkDevice(int capacity = 25) : device(new TestDevice("sink", capacity)) {
        sink = device->addSink("input", "", [this](const ObjPtr<Elem>& elem) {
            seen.push_back(codeOf(*elem));
            nbSeen.add();
        });
        device->performOpen();
    }
};

/// Of what was thrown; empty for nothing.
inline std::string textOf(const std::exception_ptr& failure) {
    try {
        if (failure) std::rethrow_exception(failure);
        return "";
    } catch (const std::exception& exception) {
        return exception.what();
    }
}

}  // namespace Orv

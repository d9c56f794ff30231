#include <string>

#include "devMgrEx.h"
#include "devPrtclEx.h"
#include "expectThrows.h"
#include "objPtr.h"

namespace Orv {

namespace {

constexpr const char* FILE_NAME = "src/resmgt/devMgrImp";

template <class Area, class Ex>
struct Row {
    static void check(const Ex& error, const std::string& reason) {
        SCOPED_TRACE(reason);
        // What is caught is a copy of a clone: as its own class, by area, and as standard classes.
        const ObjPtr<ExBase> clone(error.clone());
        expectThrows<Ex>(reason, [&] { clone->raise(); });
        EXPECT_THROW(clone->raise(), Area);
        EXPECT_THROW(clone->raise(), ExBase);
        EXPECT_THROW(clone->raise(), std::logic_error);
        EXPECT_EQ(std::string(clone->getFile()), FILE_NAME);
        EXPECT_EQ(clone->getLine(), 7);
    }
};

template <class Ex, class... Arguments>
void checkMgr(const std::string& reason, Arguments... arguments) {
    Row<DevMgrEx, Ex>::check(Ex(FILE_NAME, 7, arguments...), reason);
}

template <class Ex, class... Arguments>
void checkPrtcl(const std::string& reason, Arguments... arguments) {
    Row<DevPrtclEx, Ex>::check(Ex(FILE_NAME, 7, arguments...), reason);
}

constexpr const char* NO_TEXT = nullptr;

TEST(DevMgrEx, reasonsAreTheTextsThatProgramsLookFor) {
    checkMgr<DevMgrEx::NameNotUnique>("Not a unique name.");
    checkMgr<DevMgrEx::NameNotRegistered>("Not a registered object.");
    checkMgr<DevMgrEx::NameNotRegistered>("Not a registered object.", "mixer:gain");
    checkMgr<DevMgrEx::NameNotFound>("Named device not found.");
    checkMgr<DevMgrEx::ConfigSyntaxError>("a : [ 100% ]", "a : [ 100% ]");
    checkMgr<DevMgrEx::ConfigSyntaxError>("Configuration string Syntax error.", NO_TEXT);
    checkMgr<DevMgrEx::BadMDPrtclImp>("Managed device protocol not implemented.");
    checkMgr<DevMgrEx::SMExecutionError>("State machine error condition.");
    checkMgr<DevMgrEx::SMDomainError>("State machine domain error.");
    checkMgr<DevMgrEx::SMBadImp>("State machine bad implementation.");
    checkMgr<DevMgrEx::SMBadTransitionImp>("Bad transition implementation.");
    checkMgr<DevMgrEx::PropertySyntaxError>("mixer %s", "mixer %s");
    checkMgr<DevMgrEx::PropertySyntaxError>("Property string syntax error.", NO_TEXT);
    checkMgr<DevMgrEx::PropertyInvalidType>("Illegal type converion of property gain", "gain");
    checkMgr<DevMgrEx::PropertyInvalidType>("Illegal type converion of property <unknown>",
                                            NO_TEXT);
    checkMgr<DevMgrEx::StreamNotAvailable>("camera:video", "camera:video");
    checkMgr<DevMgrEx::StreamsNotCompatible>("a:b push c:d", "a:b push c:d");
    checkMgr<DevMgrEx::ThreadEnded>("Manager thread has ended.");
}

TEST(DevPrtclEx, reasonsAreTheTextsThatProgramsLookFor) {
    checkPrtcl<DevPrtclEx::ExNameNotUnique>("Not a unique name.");
    checkPrtcl<DevPrtclEx::ExNameNotRegistered>("Device name not found in the registry.");
    checkPrtcl<DevPrtclEx::ExMDStdAddStream>("Attempt to add stream after iterator created.");
    checkPrtcl<DevPrtclEx::ExMDPropertyIllegalOp>("\"set\" is not available for property gain\".",
                                                  "set", "gain");
    checkPrtcl<DevPrtclEx::ExMDPropertyOutOfRange>(
        "Value 7 is out of range for property gain: 0 to 1.", "gain", "7", "0 to 1");
    checkPrtcl<DevPrtclEx::ExMDStdPropertiesReadUnavail>(
        "Read-only access to mixer property sets forbidden while property builders are active.",
        "mixer", "property sets");
    checkPrtcl<DevPrtclEx::ExMDStdPropertiesWriteUnavail>(
        "Read-write access to mixer properties forbidden after read-only access has started.",
        "mixer");
    checkPrtcl<DevPrtclEx::ExMDStdPropertyGet>("Error while getting the value for 50% gain",
                                               "50% gain");
    checkPrtcl<DevPrtclEx::ExMDStdPropertyGet>("Error while getting the value for <unknown>",
                                               NO_TEXT);
    checkPrtcl<DevPrtclEx::ExMDStdPropertySet>("Error while setting the value for gain", "gain");
    checkPrtcl<DevPrtclEx::ExMDStdPropertySetBuilderPop>(
        "Trying to pop the builder's property stack when it is empty.");
    checkPrtcl<DevPrtclEx::ExMDStdFifoClosed>("Device request queue is closed.");
}

}  // namespace

}  // namespace Orv

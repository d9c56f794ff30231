#pragma once

#include <vector>

#include "devMgrTokens.h"
#include "liString.h"

namespace Orv {

/// Reads a property string, `device ":" { set ":" } property`: "mixer:channel1:eq:gain".
///
/// - Threads: one at a time.
class ORV_RESMGT_API DevMgrPropertyParser {
public:
    /// @throws DevMgrEx::PropertySyntaxError, which shows how far the string could be read.
    explicit DevMgrPropertyParser(const LiString& text);

    const LiString& getDeviceName() const noexcept { return _deviceName; }
    const LiString& getPropertyName() const noexcept { return _propertyName; }
    /// The sets it is in, outermost first.
    const std::vector<LiString>& getPropertySetPath() const noexcept { return _propertySetPath; }

private:
    LiString _deviceName;
    LiString _propertyName;
    std::vector<LiString> _propertySetPath;

    [[noreturn]] static void fail(const DevMgrTokens& tokens, const char* error);
    static void expectMore(const DevMgrTokens& tokens);
    static void takeColon(DevMgrTokens& tokens, const char* error);
};

}  // namespace Orv

#pragma once

#include "devMgrTokens.h"
#include "liString.h"

namespace Orv {

/// Reads a stream string, `[device] ":" stream ("pull" | "push") [device] ":" stream`, the source
/// first: "camera:video push display:input".
///
/// - Threads: one at a time.
class ORV_RESMGT_API DevMgrStreamParser {
public:
    enum Verb { UNDEFINED = 0, PUSH = 1, PULL = 2 };

    /// @throws DevMgrEx::ConfigSyntaxError, which shows how far the string could be read.
    explicit DevMgrStreamParser(const LiString& text);

    const LiString& getSourceDevice() const noexcept { return _sourceDevice; }  ///< Or empty.
    const LiString& getSourceStream() const noexcept { return _sourceStream; }
    const LiString& getSinkDevice() const noexcept { return _sinkDevice; }  ///< Or empty.
    const LiString& getSinkStream() const noexcept { return _sinkStream; }
    Verb getVerb() const noexcept { return _verb; }

private:
    LiString _sourceDevice, _sourceStream, _sinkDevice, _sinkStream;
    Verb _verb = UNDEFINED;

    [[noreturn]] static void fail(const DevMgrTokens& tokens, const char* error);
    static LiString takeAny(DevMgrTokens& tokens);
    static void takeEnd(DevMgrTokens& tokens, LiString& device, LiString& stream,
                        const char* error);
};

}  // namespace Orv

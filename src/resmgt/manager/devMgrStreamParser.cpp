#include "devMgrStreamParser.h"

#include "assertions.h"
#include "devMgrEx.h"

namespace Orv {

namespace {

constexpr const char* COLON = ":";

}  // namespace

DevMgrStreamParser::DevMgrStreamParser(const LiString& text) {
    const LiString initValue;
    DevMgrTokens tokens(text.getText(), COLON);
    takeEnd(tokens, _sourceDevice, _sourceStream, "expected first colon");
    if (tokens.isNext("pull")) {
        _verb = PULL;
    } else if (tokens.isNext("push")) {
        _verb = PUSH;
    } else if (!tokens.atEnd()) {
        fail(tokens, "expected pull/push verb");
    }
    takeAny(tokens);
    takeEnd(tokens, _sinkDevice, _sinkStream, "expected second colon");
    if (!tokens.atEnd()) fail(tokens, "more tokens than expected");
    ORV_ASSERT_TEXT(_verb != UNDEFINED, "_verb != UNDEFINED");
    ORV_ASSERT_TEXT(!(_sourceStream == initValue), "_sourceStream != _initValue");
    ORV_ASSERT_TEXT(!(_sinkStream == initValue), "_sinkStream != _initValue");
}

/// Reads one end of the stream.
void DevMgrStreamParser::takeEnd(DevMgrTokens& tokens, LiString& device, LiString& stream,
                                 const char* error) {
    if (!tokens.isNext(COLON)) device = takeAny(tokens);
    if (!tokens.atEnd() && !tokens.isNext(COLON)) fail(tokens, error);
    takeAny(tokens);
    stream = takeAny(tokens);
}

LiString DevMgrStreamParser::takeAny(DevMgrTokens& tokens) {
    if (tokens.atEnd()) fail(tokens, "unexpected end of tokens");
    return LiString(tokens.take());
}

void DevMgrStreamParser::fail(const DevMgrTokens& tokens, const char* error) {
    throw DevMgrEx::ConfigSyntaxError(ORV_FILE, __LINE__, tokens.describe(error).c_str());
}

}  // namespace Orv

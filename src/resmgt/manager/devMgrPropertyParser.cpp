#include "devMgrPropertyParser.h"

#include "assertions.h"
#include "devMgrEx.h"

namespace Orv {

namespace {

constexpr const char* COLON = ":";

}  // namespace

DevMgrPropertyParser::DevMgrPropertyParser(const LiString& text) {
    const LiString nullString;
    DevMgrTokens tokens(text.getText(), COLON);
    expectMore(tokens);
    if (tokens.isNext(COLON)) fail(tokens, "expected device name");
    _deviceName = LiString(tokens.take());
    takeColon(tokens, "expected colon after device name");
    for (;;) {
        expectMore(tokens);
        const LiString name(tokens.take());  // even a colon
        if (tokens.atEnd()) {
            _propertyName = name;
            break;
        }
        _propertySetPath.push_back(name);
        takeColon(tokens, "expected colon after property set name");
    }
    ORV_ASSERT_TEXT(!(_deviceName == nullString), "_deviceName != _nullString");
    ORV_ASSERT_TEXT(!(_propertyName == nullString), "_propertyName != _nullString");
}

void DevMgrPropertyParser::fail(const DevMgrTokens& tokens, const char* error) {
    throw DevMgrEx::PropertySyntaxError(ORV_FILE, __LINE__, tokens.describe(error).c_str());
}

void DevMgrPropertyParser::expectMore(const DevMgrTokens& tokens) {
    if (tokens.atEnd()) fail(tokens, "unexpected end of tokens");
}

void DevMgrPropertyParser::takeColon(DevMgrTokens& tokens, const char* error) {
    expectMore(tokens);
    if (!tokens.isNext(COLON)) fail(tokens, error);
    tokens.take();
}

}  // namespace Orv

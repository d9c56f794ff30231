#include "devMgrSyncSeqParser.h"

#include "devMgrEx.h"
#include "devMgrTokens.h"

namespace Orv {

namespace {

constexpr std::string_view ROOT_MARKER;  // leads the leaders of the trees

}  // namespace

DevMgrSyncSeqParser::DevMgrSyncSeqParser(std::string_view treeString) {
    for (DevMgrTokens tokens(treeString, "()"); !tokens.atEnd();) take(tokens.take());
    if (_state != AFTER_CLOSING || _parents.empty() || _parents.back() != ROOT_MARKER) fail();
}

void DevMgrSyncSeqParser::take(std::string_view token) {
    const bool isOpening = token == "(";
    const bool isClosing = token == ")";
    if (_state == AFTER_ROOT || _state == AFTER_NAME) addEdge();
    if (_state == AFTER_CLOSING) popParent();
    if (!isOpening && !isClosing) return takeName(token);
    if (isClosing && (_state == AFTER_ROOT || _state == AFTER_NAME || _state == AFTER_CLOSING)) {
        _state = AFTER_CLOSING;
    } else if (isOpening && _state == BEGIN) {
        _state = ROOT;
    } else if (isOpening && (_state == AFTER_ROOT || _state == AFTER_NAME)) {
        _state = GROUP;
    } else {
        fail();
    }
}

void DevMgrSyncSeqParser::takeName(std::string_view name) {
    switch (_state) {
        case ROOT:
            _parents.push_back(ROOT_MARKER);
            break;
        case GROUP:
            _parents.push_back(_current);
            break;
        case AFTER_NAME:
        case AFTER_CLOSING:
            break;
        case BEGIN:
        case AFTER_ROOT:
            fail();
    }
    _state = _state == ROOT ? AFTER_ROOT : AFTER_NAME;
    _current = name;
}

void DevMgrSyncSeqParser::addEdge() {
    if (_parents.empty()) fail();
    _edges.push_back({LiString(_parents.back()), LiString(_current)});
}

void DevMgrSyncSeqParser::popParent() {
    if (_parents.empty()) fail();
    _parents.pop_back();
}

void DevMgrSyncSeqParser::fail() {
    throw DevMgrEx::ConfigSyntaxError(ORV_FILE, __LINE__, nullptr);
}

}  // namespace Orv

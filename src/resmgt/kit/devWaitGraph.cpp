#include "devWaitGraph.h"

#include <utility>

#include "lkLock.h"

namespace Orv {

namespace {

constinit thread_local DevWaitGraph::Party* current = nullptr;

// Used by threads that outlive static objects.
LkLock& getLock() {
    static LkLock& lock = *new LkLock("DevWaitGraph");
    return lock;
}

}  // namespace

bool DevWaitGraph::isServing() noexcept {
    return current != nullptr;
}

DevWaitGraph::Serving::Serving(Target& target)
    : _target(target), _party(current != nullptr ? current : &_own) {
    current = _party;
    const LkGuard guard(getLock());
    _before = std::exchange(target._server, _party);
}

DevWaitGraph::Serving::~Serving() {
    {
        const LkGuard guard(getLock());
        if (_target._server == _party) _target._server = _before;
    }
    if (_party == &_own) current = nullptr;
}

void DevWaitGraph::Wait::enter(Kind kind, Target& target, Breaker* breaker) {
    DevWaitGraph::Party& self = *current;
    const LkGuard guard(getLock());
    _kind = kind;
    _target = &target;
    _breaker = breaker;
    // Following the threads from here leads back to this one, or to one that waits for nobody.
    for (;;) {
        Wait* way = nullptr;  // out of the circle
        const Target* next = &target;
        bool isCircle = false;
        while (next != nullptr && next->_server != nullptr) {
            DevWaitGraph::Party& server = *next->_server;
            if (&server == &self) {
                isCircle = true;
                break;
            }
            Wait* const wait = server.wait;
            if (wait == nullptr) break;
            if (wait->_breaker != nullptr && !wait->_isLetGo.load()) {
                if (wait->_kind == Kind::ROOM) way = wait;
                if (wait->_kind == Kind::ANSWER && kind == Kind::END && way == nullptr) way = wait;
            }
            if (wait->_isLetGo.load()) break;  // it is about to leave
            next = wait->_target;
        }
        if (!isCircle) break;
        if (kind == Kind::ROOM) {
            _isLetGo = true;
            return;
        }
        if (way == nullptr) {
            if (kind == Kind::ANSWER) _isRefused = true;
            break;
        }
        way->_isLetGo = true;
        way->_breaker->letGo();
    }
    if (_isRefused) return;
    _party = &self;
    _outer = std::exchange(self.wait, this);
}

void DevWaitGraph::Wait::leave() {
    const LkGuard guard(getLock());
    _party->wait = _outer;
}

}  // namespace Orv

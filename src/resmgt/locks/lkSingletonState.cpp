#include "lkSingletonState.h"

#include <algorithm>
#include <cstring>
#include <exception>
#include <map>
#include <memory>
#include <string_view>
#include <utility>

#include "assertions.h"
#include "formatText.h"
#include "lkLock.h"
#include "lkNative.h"
#include "lkThreadId.h"

namespace Orv {

/// All singletons of the process. Never destroyed.
class LkSingletonState::Registry {
public:
    static Registry& getInstance() {
        static auto* const registry = new Registry;
        return *registry;
    }

    LkSingletonState& find(const char* typeName) {
        const LkGuard guard(_lock);
        std::unique_ptr<LkSingletonState>& state = _states[typeName];
        if (!state) state.reset(new LkSingletonState(typeName));
        return *state;
    }

    void noteMade(LkSingletonState& state) {
        const LkGuard guard(_lock);
        state._madeBefore = std::exchange(_lastMade, &state);
    }

    /// The one made last, which leaves the list; null if there is none.
    LkSingletonState* takeLastMade() {
        const LkGuard guard(_lock);
        LkSingletonState* const last = _lastMade;
        if (last != nullptr) _lastMade = last->_madeBefore;
        return last;
    }

    void reviveAll() {
        const LkGuard guard(_lock);
        for (const auto& [typeName, state] : _states) {
            State destroyed = DESTROYED;
            state->_state.compare_exchange_strong(destroyed, UNINITIALIZED);
        }
    }

private:
    LkLock _lock{"LkSingletonState registry"};
    std::map<std::string, std::unique_ptr<LkSingletonState>> _states ORV_GUARDED_BY(_lock);
    LkSingletonState* _lastMade ORV_GUARDED_BY(_lock) = nullptr;
};

LkSingletonState& LkSingletonState::get(const char* typeName) {
    return Registry::getInstance().find(typeName);
}

void* LkSingletonState::createInstance(Create create, Destroy destroy) {
    const unsigned long self = LkThreadId(LkThreadId::CURRENT_THREAD).getNum();
    ORV_ASSERT_TEXT(_state.load() != DESTROYED,
                    "LkSingleton<T>::_state != LkSingleton<T>::DESTROYED");
    ORV_ASSERT_TEXT(_creator.load() != self, "LkSingleton<T>::_creator != current thread");

    LkNamedMutexNative mutex(makeMutexName().c_str());
    const LkGuard<LkNamedMutexNative> guard(mutex);
    if (_state.load() == INITIALIZED) return _instance;
    ORV_ASSERT(_state == UNINITIALIZED);

    _creator.store(self);
    try {
        _instance = create();
    } catch (...) {
        _creator.store(0);
        throw;
    }
    _creator.store(0);
    _destroy = destroy;
    Registry::getInstance().noteMade(*this);
    _state.store(INITIALIZED, std::memory_order_release);
    return _instance;
}

/// "LkSingleton ", the type, and the process, so that two processes never wait for each other.
std::string LkSingletonState::makeMutexName() const {
    constexpr std::string_view baseName = "LkSingleton ";
    constexpr std::size_t pidLength = 12;
    constexpr std::size_t maxPath = 260;
    ORV_ASSERT_TEXT(baseName.size() + pidLength + _typeName.size() < maxPath - 1,
                    "::strlen( MUTEX_BASE_NAME ) + PID_LEN + "
                    "::strlen( ORV_TYPE_NAME( Id ) ) < MAX_PATH - 1");
    std::string name = formatText("%s%s%12ld", baseName.data(), _typeName.c_str(),
                                  LkNamedMutexNative::getProcessId());
    std::replace(name.begin(), name.end(), '\\', '/');
    return name;
}

void LkSingletonState::destroyInstance() {
    _state.store(DESTROYED);
    _destroy(std::exchange(_instance, nullptr));
}

void LkSingletonState::destroyAll() {
    std::exception_ptr firstError;
    while (LkSingletonState* const state = Registry::getInstance().takeLastMade()) {
        try {
            state->destroyInstance();
        } catch (...) {
            if (!firstError) firstError = std::current_exception();
        }
    }
    if (firstError) std::rethrow_exception(firstError);
}

void LkSingletonState::reviveAll() {
    Registry::getInstance().reviveAll();
}

}  // namespace Orv

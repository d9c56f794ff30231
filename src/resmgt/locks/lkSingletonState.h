#pragma once

#include <atomic>
#include <string>

#include "resmgtApi.h"

namespace Orv {

/// What the process knows of one singleton, for LkSingleton: it stands here, in one library, so
/// that all that ask find the same. Never destroyed.
class ORV_RESMGT_API LkSingletonState {
public:
    enum State { UNINITIALIZED, INITIALIZED, DESTROYED };
    using Create = void* (*)();
    using Destroy = void (*)(void*);

    /// The state known under @p typeName, which is copied.
    static LkSingletonState& get(const char* typeName);

    void* getInstance(Create create, Destroy destroy) {
        if (_state.load(std::memory_order_acquire) == INITIALIZED) [[likely]]
            return _instance;
        return createInstance(create, destroy);
    }

    /// Destroys every instance, the last made first; the first exception is thrown at the end.
    static void destroyAll();

    /// Lets what destroyAll() destroyed be made again, for a start-up that failed and is repeated.
    static void reviveAll();

private:
    class Registry;

    const std::string _typeName;
    std::atomic<State> _state{UNINITIALIZED};
    std::atomic<unsigned long> _creator{0};  // the thread inside the constructor
    void* _instance = nullptr;
    Destroy _destroy = nullptr;
    LkSingletonState* _madeBefore =
        nullptr;  // of those not destroyed yet; under the registry's lock

    explicit LkSingletonState(const char* typeName) : _typeName(typeName) {}

    void* createInstance(Create create, Destroy destroy);
    std::string makeMutexName() const;
    void destroyInstance();
};

}  // namespace Orv

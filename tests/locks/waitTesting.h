#pragma once

#include <atomic>
#include <chrono>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

namespace Orv {

/// Runs the action on a number of threads at once, with the thread's number, and joins them.
template <class Action>
void onThreads(int nbThreads, Action action) {
    std::vector<std::jthread> threads;
    for (int i = 0; i < nbThreads; ++i) threads.emplace_back([&action, i] { action(i); });
}

template <class Object>
std::string dumpOf(const Object& object) {
    std::ostringstream stream;
    object.dump(stream);
    return stream.str();
}

/// Lets one thread wait for objects that it destroys as soon as its wait returns, while another one
/// ends the wait: at once, while the waiter still looks, and when it sleeps.
/// @param wait   is called with a new object and `publish`, which it calls before it waits
/// @param finish  ends the wait
template <class Object, class Wait, class Finish>
void destroyAfterEachWait(int nbRounds, Wait wait, Finish finish) {
    std::atomic<Object*> published{nullptr};
    std::jthread finisher([&] {
        for (int round = 0; round < nbRounds; ++round) {
            Object* object = nullptr;
            while ((object = published.exchange(nullptr)) == nullptr) std::this_thread::yield();
            if (round % 64 == 0) std::this_thread::sleep_for(std::chrono::microseconds(100));
            if (round % 3 == 0) std::this_thread::yield();
            finish(*object);
        }
    });
    for (int round = 0; round < nbRounds; ++round) {
        auto* const object = new Object;
        wait(*object, [&] { published = object; });
        delete object;
    }
}

}  // namespace Orv

#pragma once

#include <list>

namespace Orv {

/// Place of an object in a list of borrowed objects, made ready beforehand: taking it and leaving
/// it never fails and costs the same however long the list is.
///
/// - Threads: guarded by whatever guards the list.
template <class T>
class PrioritySeat {
public:
    using List = std::list<T*>;

    explicit PrioritySeat(T* object) : _spare{object}, _place(_spare.begin()) {}

    PrioritySeat(const PrioritySeat&) = delete;
    PrioritySeat& operator=(const PrioritySeat&) = delete;

    bool isTaken() const noexcept { return _spare.empty(); }
    void take(List& list) noexcept { list.splice(list.end(), _spare); }
    void leave(List& list) noexcept { _spare.splice(_spare.begin(), list, _place); }

private:
    List _spare;  // holds the place while it is in no other list
    typename List::iterator _place;
};

}  // namespace Orv

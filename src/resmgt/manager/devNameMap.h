#pragma once

#include <list>
#include <unordered_map>
#include <utility>

#include "liString.h"

namespace Orv {

/// What a name stands for, found by the name's hash; the names also stand in order of insertion.
///
/// - Threads: as a standard container.
template <class T>
class DevNameMap {
public:
    using Item = std::pair<const LiString, T>;

    DevNameMap() : _map(NB_INITIAL_BUCKETS) {}

    /// @return false, and nothing is done, if the name is taken.
    bool insert(const LiString& name, T value) {
        if (find(name) != nullptr) return false;
        const auto position = _items.emplace(_items.end(), name, std::move(value));
        try {
            _map.emplace(name, position);
        } catch (...) {
            _items.erase(position);
            throw;
        }
        return true;
    }

    T* find(const LiString& name) {  ///< Null if the name is not there.
        const auto found = _map.find(name);
        return found != _map.end() ? &found->second->second : nullptr;
    }
    const T* find(const LiString& name) const { return const_cast<DevNameMap*>(this)->find(name); }

    void erase(const LiString& name) {
        const auto found = _map.find(name);
        if (found == _map.end()) return;
        const auto position = found->second;
        _map.erase(found);
        _items.erase(position);
    }

    std::size_t getSize() const noexcept { return _items.size(); }
    auto begin() const noexcept { return _items.begin(); }
    auto end() const noexcept { return _items.end(); }

private:
    static constexpr std::size_t NB_INITIAL_BUCKETS = 8;

    std::list<Item> _items;
    std::unordered_map<LiString, typename std::list<Item>::iterator> _map;
};

}  // namespace Orv

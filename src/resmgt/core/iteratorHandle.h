#pragma once

#include <cstddef>
#include <iterator>

#include "iteratorEx.h"
#include "iteratorImp.h"
#include "rcPvtEngPtr.h"

namespace Orv {

/// What Iterator and ConstIterator share: a value that stands at an item of a container, or behind
/// the last one.
///
/// A range-based for runs over the whole container wherever the iterator stands.
///
/// - Threads: copies may be used by different threads at once, as far as the container may be read.
/// - Ownership: the container is borrowed; while it is iterated, no items come or go.
/// - Errors: IteratorEx::ExOutOfRange past either end, RCEx::ExNullPtr from a default-constructed
///   iterator; either leaves the iterator where it was.
template <class Self, class Imp, class T>
class IteratorHandle {
public:
    using iterator_category = std::bidirectional_iterator_tag;
    using value_type = std::remove_const_t<T>;
    using difference_type = std::ptrdiff_t;
    using pointer = T*;
    using reference = T&;

    void first() { change().moveToFirst(); }
    void last();  ///< To the last item; behind it in an empty container.
    void next() { change().next(); }
    void previous() { change().previous(); }

    bool atBegin() const { return _imp->atBegin(); }
    bool atEnd() const { return _imp->atEnd(); }
    std::size_t getCardinality() const { return _imp->getCardinality(); }  ///< Items in all.

    Self begin() const;  ///< A copy at the first item.
    Self end() const;    ///< A copy behind the last item.

    T& operator*() const { return self().item(); }
    T* operator->() const { return &self().item(); }
    Self& operator++() { return next(), self(); }
    Self& operator--() { return previous(), self(); }
    Self operator++(int);
    Self operator--(int);

    friend bool operator==(const Self& left, const Self& right) {
        return left._imp->isEqual(*right._imp);
    }

protected:
    IteratorHandle() noexcept = default;
    explicit IteratorHandle(Imp* imp) noexcept : _imp(imp) {}

    const RCPvtEngPtr<Imp>& getImp() const noexcept { return _imp; }

private:
    RCPvtEngPtr<Imp> _imp;

    Self& self() noexcept { return static_cast<Self&>(*this); }
    const Self& self() const noexcept { return static_cast<const Self&>(*this); }

    Imp& change() {
        if (!_imp.isUnshared()) _imp.reset(_imp->clone());
        return *_imp;
    }
};

template <class Self, class Imp, class T>
void IteratorHandle<Self, Imp, T>::last() {
    Imp& imp = change();
    imp.moveToEnd();
    if (!imp.atBegin()) imp.previous();
}

template <class Self, class Imp, class T>
Self IteratorHandle<Self, Imp, T>::begin() const {
    Self result = self();
    result.change().moveToFirst();
    return result;
}

template <class Self, class Imp, class T>
Self IteratorHandle<Self, Imp, T>::end() const {
    Self result = self();
    result.change().moveToEnd();
    return result;
}

template <class Self, class Imp, class T>
Self IteratorHandle<Self, Imp, T>::operator++(int) {
    Self before = self();
    next();
    return before;
}

template <class Self, class Imp, class T>
Self IteratorHandle<Self, Imp, T>::operator--(int) {
    Self before = self();
    previous();
    return before;
}

}  // namespace Orv

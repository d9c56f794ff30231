#pragma once

#include "iteratorHandle.h"
#include "iteratorSTL.h"

namespace Orv {

/// Runs over the items of some container and may change them; the container's type stays hidden.
/// IteratorHandle has the operations; where items are only read, take a ConstIterator.
///
///     for (LiString& name : Iterator<LiString>::over(names)) name += "!";
template <class T>
class ORV_HEADER_API Iterator : public IteratorHandle<Iterator<T>, IteratorImp<T>, T> {
public:
    Iterator() noexcept = default;
    explicit Iterator(IteratorImp<T>* imp) noexcept : Iterator::IteratorHandle(imp) {}

    /// At the first item of @p container, which is borrowed.
    template <class Container>
    [[nodiscard]] static Iterator over(Container& container) {
        return Iterator(new IteratorSTL<Container>(container));
    }

    /// @throws IteratorEx::ExOutOfRange behind the last item.
    T& item() const { return this->getImp()->getMutableItem(); }

    /// For who wraps the implementation: a copy of it; null if there is none.
    [[nodiscard]] IteratorImp<T>* cloneImp() const {
        return this->getImp().isNull() ? nullptr : this->getImp()->clone();
    }
};

}  // namespace Orv

#pragma once

#include "iterator.h"

namespace Orv {

/// Runs over the items of some container and reads them; the container's type stays hidden.
/// IteratorHandle has the operations.
///
///     for (const LiString& name : ConstIterator<LiString>::over(names)) std::cout << name;
template <class T>
class ORV_HEADER_API ConstIterator
    : public IteratorHandle<ConstIterator<T>, ConstIteratorImp<T>, const T> {
public:
    ConstIterator() noexcept = default;
    explicit ConstIterator(ConstIteratorImp<T>* imp) noexcept
        : ConstIterator::IteratorHandle(imp) {}

    /// Stands where @p other does.
    ConstIterator(const Iterator<T>& other) : ConstIterator(other.cloneImp()) {}

    /// At the first item of @p container, which is borrowed.
    template <class Container>
    [[nodiscard]] static ConstIterator over(const Container& container) {
        return ConstIterator(new ConstIteratorSTL<Container>(container));
    }

    /// @throws IteratorEx::ExOutOfRange behind the last item.
    const T& item() const { return this->getImp()->getItem(); }
};

}  // namespace Orv

#pragma once

#include "iteratorEx.h"
#include "iteratorImp.h"

namespace Orv {

/// Iteration over a container of the standard library's kind, such as Vector and List.
/// @tparam Imp  the interface; @tparam Container  const where the interface only reads.
template <class Imp, class Container>
class IteratorSTLBase : public Imp {
public:
    /// Starts at the first item. @p container is borrowed and must outlive this and its clones.
    explicit IteratorSTLBase(Container& container)
        : _container(&container), _position(container.begin()) {}

    void moveToFirst() override { _position = _container->begin(); }
    void moveToEnd() override { _position = _container->end(); }
    void next() override {
        check(!atEnd());
        ++_position;
    }
    void previous() override {
        check(!atBegin());
        --_position;
    }
    const typename Container::value_type& getItem() const override { return getItemHere(); }
    bool atBegin() const override { return _position == _container->begin(); }
    bool atEnd() const override { return _position == _container->end(); }
    std::size_t getCardinality() const override { return _container->size(); }

    bool isEqual(const ConstIteratorImp<typename Container::value_type>& other) const override {
        const auto* const same = dynamic_cast<const IteratorSTLBase*>(&other);
        return same != nullptr && same->_container == _container && same->_position == _position;
    }

protected:
    decltype(auto) getItemHere() const {
        check(!atEnd());
        return *_position;
    }

private:
    Container* _container;
    decltype(std::declval<Container&>().begin()) _position;

    static void check(bool isInside) {
        if (!isInside) IteratorEx::throwExOutOfRange();
    }
};

/// Reads the items of a container.
template <class Container>
class ORV_HEADER_API ConstIteratorSTL
    : public IteratorSTLBase<ConstIteratorImp<typename Container::value_type>, const Container> {
public:
    using ConstIteratorSTL::IteratorSTLBase::IteratorSTLBase;
    [[nodiscard]] ConstIteratorSTL* clone() const override { return new ConstIteratorSTL(*this); }
};

/// Reads and changes the items of a container.
template <class Container>
class ORV_HEADER_API IteratorSTL
    : public IteratorSTLBase<IteratorImp<typename Container::value_type>, Container> {
public:
    using IteratorSTL::IteratorSTLBase::IteratorSTLBase;
    [[nodiscard]] IteratorSTL* clone() const override { return new IteratorSTL(*this); }
    typename Container::value_type& getMutableItem() const override { return this->getItemHere(); }
};

}  // namespace Orv

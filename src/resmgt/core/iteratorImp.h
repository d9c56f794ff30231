#pragma once

#include <cstddef>

#include "baseApi.h"
#include "rcBase.h"

namespace Orv {

/// What a ConstIterator does to the container it was made for; IteratorSTL and ConstIteratorSTL
/// are the ready ones. Steps past either end throw IteratorEx::ExOutOfRange.
template <class T>
class ORV_HEADER_API ConstIteratorImp : public RCBase<LkCounter<long>> {
public:
    /// A new implementation at the same position, without holder.
    [[nodiscard]] virtual ConstIteratorImp* clone() const = 0;

    virtual void moveToFirst() = 0;
    virtual void moveToEnd() = 0;
    virtual void next() = 0;
    virtual void previous() = 0;
    virtual const T& getItem() const = 0;
    virtual bool atBegin() const = 0;
    virtual bool atEnd() const = 0;
    virtual std::size_t getCardinality() const = 0;

    /// Whether @p other stands at the same position of the same container.
    virtual bool isEqual(const ConstIteratorImp& other) const = 0;
};

/// The same for an Iterator, which may change what it stands at.
template <class T>
class ORV_HEADER_API IteratorImp : public ConstIteratorImp<T> {
public:
    [[nodiscard]] IteratorImp* clone() const override = 0;
    virtual T& getMutableItem() const = 0;
};

}  // namespace Orv

#pragma once

#include <typeinfo>

namespace Orv {

/// Tags of the packages: one empty class each, declared by the library that has the package.
namespace OrvInit {
class base {};  ///< libORVbase itself; every other package depends on it.
}  // namespace OrvInit

/// Identity of a package, by its tag. Dependencies are lists of these.
template <class Tag>
class InInit {
public:
    static const std::type_info& getType() noexcept { return typeid(Tag); }
};

}  // namespace Orv

#pragma once

#include <memory>
#include <string>
#include <string_view>
#include <utility>

#include "baseApi.h"

namespace Orv {

/// Root of every exception of the system: where it was raised, and why.
///
/// Each area has a class `<Area>Ex` below it, each error a class below that, which is also one
/// standard exception. Catch by area, by standard class, as std::exception or as ExBase: what()
/// gives the same reason through each. ExBase itself is no std::exception, so that a concrete
/// class contains exactly one; derive concrete classes from ExConcrete.
///
/// - Threads: like any value. Copies share the reason's text and never throw.
class ORV_BASE_API ExBase {
public:
    virtual ~ExBase();

    virtual const char* what() const noexcept;  ///< Same as getReason().

    /// Heap copy of the whole object; the caller owns it.
    [[nodiscard]] virtual ExBase* clone() const = 0;

    /// Throws a copy of the whole object, as its own class.
    [[noreturn]] virtual void raise() const = 0;

    const char* getReason() const noexcept;
    const char* getFile() const noexcept { return _file; }  ///< Such as "src/resmgt/lkMutex".
    int getLine() const noexcept { return _line; }

protected:
    /// @param file  borrowed for ever, as ORV_FILE gives it.
    ExBase(const char* file, int line) noexcept;
    ExBase(const ExBase&) noexcept;
    ExBase& operator=(const ExBase&) noexcept;

    void setReason(std::string_view reason);
    void appendReason(std::string_view piece);

private:
    const char* _file;
    int _line;
    std::shared_ptr<const std::string> _reason;  // null: no reason given
};

/// Base of a concrete exception @p Self of the area @p Area: adds the standard class, what(),
/// clone() and raise(). With @p Standard left out, the area brings the standard class itself.
template <class Self, class Area, class Standard = void>
class ORV_HEADER_API ExConcrete : public Standard, public Area {
public:
    const char* what() const noexcept override { return Area::getReason(); }
    [[nodiscard]] ExBase* clone() const override { return new Self(self()); }
    [[noreturn]] void raise() const override { throw Self(self()); }

protected:
    template <class... Arguments>
    explicit ExConcrete(Arguments&&... arguments)
        : Standard(""), Area(std::forward<Arguments>(arguments)...) {}

private:
    const Self& self() const noexcept { return static_cast<const Self&>(*this); }
};

template <class Self, class Area>
class ORV_HEADER_API ExConcrete<Self, Area, void> : public Area {
public:
    [[nodiscard]] ExBase* clone() const override { return new Self(self()); }
    [[noreturn]] void raise() const override { throw Self(self()); }

protected:
    using Area::Area;

private:
    const Self& self() const noexcept { return static_cast<const Self&>(*this); }
};

}  // namespace Orv

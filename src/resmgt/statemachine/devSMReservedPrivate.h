#pragma once

namespace Orv {

/// Names that the builder adds to a machine, and the beginnings of those it composes. A description
/// cannot declare the first three.
struct DevSMReserved {
    static constexpr const char* ILLEGAL = "_ill";         ///< State and transition.
    static constexpr const char* EXCEPTION = "_exc";       ///< State, event and transition.
    static constexpr const char* NO_EXCEPTION = "_noexc";  ///< Event and transition.
    static constexpr const char* EXCEPTION_CHECK = "_exchk";
    static constexpr const char* CONDITION_STATE = "_cs";
    static constexpr const char* CONDITION_EVENT = "_ce";
    static constexpr const char* CONDITION_TRANSITION = "_ct";
};

}  // namespace Orv

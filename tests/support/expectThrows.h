#pragma once

#include <gtest/gtest.h>
#include <source_location>
#include <string_view>
#include <typeinfo>

#include "assertionEx.h"
#include "demangle.h"
#include "exBase.h"

namespace Orv {

/// Expects @p action to throw an exception of exactly the class @p Ex whose what() is @p reason,
/// seen as std::exception and, where it is one, as ExBase.
template <class Ex, class Action>
void expectThrows(std::string_view reason, Action&& action,
                  std::source_location where = std::source_location::current()) {
    const testing::ScopedTrace trace(where.file_name(), static_cast<int>(where.line()),
                                     "expectThrows");
    try {
        action();
        ADD_FAILURE() << "nothing was thrown instead of " << demangle(typeid(Ex));
    } catch (const std::exception& exception) {
        EXPECT_EQ(demangle(typeid(exception)), demangle(typeid(Ex)));
        EXPECT_EQ(std::string_view(exception.what()), reason);
        if constexpr (std::is_base_of_v<ExBase, Ex>) {
            const auto* const base = dynamic_cast<const ExBase*>(&exception);
            ASSERT_NE(base, nullptr) << "it is no ExBase";
            EXPECT_EQ(std::string_view(base->getReason()), reason);
        }
    } catch (...) {
        ADD_FAILURE() << "what was thrown is no std::exception";
    }
}

/// Expects @p action to break the assertion of the given text.
/// @tparam Assertion  AssertionFailed, SysAssertionFailed or ProgramAborted
template <class Assertion = AssertionFailed, class Action>
void expectAsserts(std::string_view expression, Action&& action,
                   std::source_location where = std::source_location::current()) {
    const testing::ScopedTrace trace(where.file_name(), static_cast<int>(where.line()),
                                     "expectAsserts");
    try {
        action();
        ADD_FAILURE() << "nothing was asserted";
    } catch (const AssertionEx& assertion) {
        EXPECT_EQ(demangle(typeid(assertion)), demangle(typeid(Assertion)));
        EXPECT_EQ(std::string_view(assertion.getExpression()), expression);
    }
}

}  // namespace Orv

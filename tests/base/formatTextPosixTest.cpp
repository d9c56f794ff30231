#include <stdexcept>

#include "formatText.h"

namespace Orv {

namespace {

TEST(FormatText, refusesWhatTheLocaleCannotWrite) {
    const wchar_t ideograph[] = {0x4e00, 0};  // the "C" locale has none
    EXPECT_THROW(formatText("%ls", ideograph), std::length_error);
}

}  // namespace

}  // namespace Orv

// Strings and counted objects that pass between the library and an application, each of which has
// compiled the inline parts for itself.
#include <gtest/gtest.h>
#include <orv/base.h>
#include <orv/resmgt.h>
#include <sstream>
#include <stdexcept>
#include <utility>

namespace Orv {

namespace {

TEST(Library, hasOneImplementationOfEmptyStringsOnBothSides) {
    std::istringstream nothing;
    LiString madeByLibrary = LiStringParser().readToken(nothing);
    EXPECT_EQ(madeByLibrary.getChars(), LiString().getChars());
    for (int round = 0; round < 100; ++round) {
        const LiString copy = madeByLibrary;
        madeByLibrary = std::move(madeByLibrary) + copy + "x";
        const LiString moved = std::move(madeByLibrary);
        EXPECT_EQ(moved, "x");
        madeByLibrary = LiStringParser().readToken(nothing);
    }
    EXPECT_EQ(madeByLibrary.getChars(), LiString("").getChars());
}

TEST(Library, freesWhatTheApplicationAllocatedAndTheOtherWayRound) {
    ArrayPtr<char> chars = ArrayPtr<char>::allocate(4);
    std::char_traits<char>::copy(chars.get(), "abc", 4);
    LiString string(std::move(chars));
    string += LiString(std::string(1000, 'd').c_str());
    const ArrayPtr<char> back = string.releaseChars();
    EXPECT_EQ(back[1003], '\0');
    EXPECT_TRUE(string.isEmpty());
}

TEST(Library, throwsWhatTheApplicationCatchesByEachOfItsClasses) {
    const LiString string("abc");
    EXPECT_THROW(static_cast<void>(string[3]), std::range_error);
    EXPECT_THROW(static_cast<void>(string[3]), LiStringEx);
    EXPECT_THROW(static_cast<void>(*RCShdPtr<RCProxy<int>>()), RCEx::ExNullPtr);
    EXPECT_THROW(ConstIterator<int>::over(Vector<int>()).next(), std::out_of_range);
}

}  // namespace

}  // namespace Orv

#include <stdexcept>

#include "demangle.h"
#include "exBase.h"
#include "exSysError.h"
#include "formatText.h"
#include "osError.h"
#include "rcEx.h"
#include "rcExUtil.h"
#include "sourceFile.h"

namespace Orv {

namespace {

template <class Caught>
std::string whatCaughtAs(const ExBase& exception) {
    try {
        exception.raise();
    } catch (const Caught& caught) {
        return caught.what();
    }
    return "nothing";
}

/// An exception of an area in which a reason is put together from pieces.
class PieceEx : public ExBase {
public:
    class ExPieces;

protected:
    using ExBase::ExBase;
};

class PieceEx::ExPieces : public ExConcrete<ExPieces, PieceEx, std::range_error> {
public:
    explicit ExPieces(const std::vector<std::string>& pieces) : ExConcrete("some/file", 7) {
        for (const std::string& piece : pieces) appendReason(piece);
    }
    void append(const char* piece) { appendReason(piece); }
};

TEST(ExBase, tellsItsReasonThroughEveryBase) {
    const RCEx::ExNullPtr exception("src/resmgt/rcExUtil", 30);
    const std::string reason = "Dereferencing a null pointer";
    EXPECT_EQ(whatCaughtAs<RCEx::ExNullPtr>(exception), reason);
    EXPECT_EQ(whatCaughtAs<RCEx>(exception), reason);
    EXPECT_EQ(whatCaughtAs<ExBase>(exception), reason);
    EXPECT_EQ(whatCaughtAs<std::domain_error>(exception), reason);
    EXPECT_EQ(whatCaughtAs<std::logic_error>(exception), reason);
    EXPECT_EQ(whatCaughtAs<std::exception>(exception), reason);
}

TEST(ExBase, aCloneIsWholeAndOutlivesItsOriginal) {
    std::unique_ptr<ExBase> copy;
    {
        PieceEx::ExPieces original({"one ", "two"});
        copy.reset(original.clone());
        original.append(" three");
        EXPECT_STREQ(original.what(), "one two three");
    }
    EXPECT_STREQ(copy->what(), "one two");
    EXPECT_STREQ(copy->getReason(), "one two");
    EXPECT_STREQ(copy->getFile(), "some/file");
    EXPECT_EQ(copy->getLine(), 7);
    EXPECT_THROW(copy->raise(), PieceEx::ExPieces);
    EXPECT_THROW(copy->raise(), std::range_error);
}

TEST(ExBase, aReasonIsNeverCutNorReadAsAFormat) {
    const std::string huge(1'000'000, '%');
    EXPECT_EQ(PieceEx::ExPieces({huge, "%s%n"}).what(), huge + "%s%n");
    EXPECT_STREQ(PieceEx::ExPieces({}).what(), "");
}

TEST(RCExUtil, raisesTheNullPointerErrorAtItsPlace) {
    try {
        RCExUtil::throwExNullPtr();
        FAIL() << "returned";
    } catch (const RCEx& exception) {
        EXPECT_STREQ(exception.getFile(), "src/resmgt/rcExUtil");
        EXPECT_EQ(exception.getLine(), 30);
    }
}

TEST(ExSysError, namesStepAndCodeAndTheSystemsText) {
    const ExSysError exception("f", 1, "open", 2);  // "no such file" on either system
    EXPECT_EQ(exception.getOsError(), 2);
    EXPECT_EQ(std::string(exception.what()), "open failed: " + OsError::describe(2));
    EXPECT_EQ(OsError::describe(2).find("error 2 ("), 0U);
    EXPECT_FALSE(OsError::getText(2).empty());
    EXPECT_EQ(OsError::getText(2).find_first_of("\r\n"), std::string::npos);
    EXPECT_NE(OsError::getText(2), OsError::getText(5));
    EXPECT_FALSE(OsError::getText(123456789).empty());
    EXPECT_THROW(exception.raise(), std::runtime_error);
}

TEST(SourceFile, dropsModuleFolderAndExtension) {
    EXPECT_STREQ(SourceFile("/x/src/base/exBase.cpp").chars, "src/base/exBase");
    EXPECT_STREQ(SourceFile("/x/src/resmgt/locks/lkMutex.cpp").chars, "src/resmgt/lkMutex");
    EXPECT_STREQ(SourceFile("src/resmgt/locks/lkMutex.imp").chars, "src/resmgt/lkMutex");
    EXPECT_STREQ(SourceFile("C:\\x\\src\\resmgt\\locks\\lkMutex.cpp").chars, "src/resmgt/lkMutex");
    EXPECT_STREQ(SourceFile("/usr/include/orv/rcBase.imp").chars, "src/resmgt/rcBase");
    EXPECT_STREQ(SourceFile("/src/base/orv/src/resmgt/core/a.cpp").chars, "src/resmgt/a");
    EXPECT_STREQ(SourceFile("/src/resmgt/orv/src/base/a.cpp").chars, "src/base/a");
    EXPECT_STREQ(SourceFile("/home/me/player.v2/main.cpp").chars, "main");
    EXPECT_STREQ(SourceFile("a.b.cpp").chars, "a.b");
    EXPECT_STREQ(SourceFile("Makefile").chars, "Makefile");
    EXPECT_STREQ(ORV_FILE, "exBaseTest");
}

TEST(FormatText, writesTextsOfAnyLength) {
    const std::string huge(100'000, 'x');
    EXPECT_EQ(formatText("<%s|%d>", huge.c_str(), -5), "<" + huge + "|-5>");
    EXPECT_EQ(formatText("%s", ""), "");
    EXPECT_EQ(formatText("a%cb", '\0'), std::string("a\0b", 3));
    EXPECT_EQ(formatText("%lld %llu %zu", -1LL, ~0ULL, sizeof(char)), "-1 18446744073709551615 1");
}

TEST(Demangle, namesTypesAsTheSourceDoes) {
    EXPECT_EQ(demangle(typeid(RCEx::ExNullPtr)), "Orv::RCEx::ExNullPtr");
    EXPECT_EQ(demangle(typeid(int)), "int");
}

}  // namespace

}  // namespace Orv

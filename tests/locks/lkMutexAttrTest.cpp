#include "expectThrows.h"
#include "lkMutexAttr.h"

namespace Orv {

namespace {

std::string textOf(const LkMutexAttr& attr) {
    std::ostringstream text;
    attr.dump(text);
    return text.str();
}

TEST(LkMutexAttr, hasNoProtocolWhateverIsSet) {
    LkMutexAttr attr("mine");
    attr.setPrioProtocol(LkMutexAttr::PROTECT, 63);
    EXPECT_FALSE(attr.isSetPrioProtocolImplemented());
    EXPECT_EQ(attr.getPrioProtocol(), LkMutexAttr::UNIMPLEMENTED);
    EXPECT_EQ(attr.getPrioCeiling(), 0);
    EXPECT_EQ(textOf(attr), "mine prot UNIMPLEMENTED ceil 0");
    EXPECT_EQ(textOf(LkMutexAttr::getDefaultAttr()),
              "DefaultLkMutexAttr prot UNIMPLEMENTED ceil 0");
}

TEST(LkMutexAttr, printsProtocolsByNameAndRefusesOthers) {
    std::ostringstream text;
    for (int value = 0; value < 4; ++value) text << LkMutexAttr::PrioProtocol(value) << " ";
    EXPECT_EQ(text.str(), "UNIMPLEMENTED NONE INHERIT PROTECT ");
    EXPECT_THROW(text << LkMutexAttr::PrioProtocol(4), ProgramAborted);
}

}  // namespace

}  // namespace Orv

#include <gtest/gtest.h>
#include <limits>
#include <optional>

#include "expectThrows.h"
#include "mbAlignment.h"
#include "mbEx.h"

namespace Orv {

namespace {

constexpr std::uint64_t END = std::numeric_limits<std::uint64_t>::max();

TEST(MbAlignment, roundsToTheNearestAddressThatFits) {
    struct Case {
        int line;
        MbAlignment alignment;
        std::uint64_t address, up, down;
    };
    const Case cases[] = {
        {__LINE__, {}, 0x1001, 0x1001, 0x1001},
        {__LINE__, {0xFF, 0, 0}, 0x1000, 0x1000, 0x1000},
        {__LINE__, {0xFF, 0, 0}, 0x1001, 0x1100, 0x1000},
        {__LINE__, {0, 0xFF, 0x10}, 0x1001, 0x1010, 0xF10},
        {__LINE__, {0, 0xFF, 0x10}, 0x1010, 0x1010, 0x1010},
        {__LINE__, {0, 0xFF, 0x10}, 0x1011, 0x1110, 0x1010},
        {__LINE__, {0xF, 0xFF, 0x20}, 0x1021, 0x1120, 0x1020},
        {__LINE__, {0xF, 0xFF, 0x23}, 0x1021, 0x1120, 0x1020},  // the alignment rules
        {__LINE__, {0, 0xFF, 0xAB10}, 0x1011, 0x1110, 0x1010},  // the pattern beyond the mask
        {__LINE__, {0xFF, 0, 0}, END - 0xFF, END - 0xFF, END - 0xFF},
        {__LINE__, {END >> 1, 0, 0}, 1, (END >> 1) + 1, 0},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.line);
        EXPECT_EQ(c.alignment.roundUpToAlignment(c.address), c.up);
        EXPECT_EQ(c.alignment.roundDownToAlignment(c.address), c.down);
        EXPECT_TRUE(c.alignment.isAligned(c.up));
        EXPECT_TRUE(c.alignment.isAligned(c.down));
        EXPECT_EQ(c.alignment.isAligned(c.address), c.address == c.up);
    }
}

TEST(MbAlignment, paddingNeverExceedsWhatItAnnounces) {
    for (const MbAlignment& alignment : {MbAlignment(), MbAlignment(0x3F, 0, 0),
                                         MbAlignment(0, 0x7F, 0x15), MbAlignment(7, 0x1FF, 0x88)}) {
        std::uint64_t mostUp = 0;
        std::uint64_t mostDown = 0;
        for (std::uint64_t address = 0x10000; address < 0x10800; ++address) {
            mostUp = std::max(mostUp, alignment.roundUpToAlignment(address) - address);
            mostDown = std::max(mostDown, address - alignment.roundDownToAlignment(address));
        }
        EXPECT_EQ(mostUp, alignment.getRoundUpMax(1));
        EXPECT_EQ(mostDown, alignment.getRoundDownMax(1));
        EXPECT_EQ(alignment.getRoundUpMax(0), 0u);
        EXPECT_EQ(alignment.getRoundDownMax(0), 0u);
    }
}

TEST(MbAlignment, refusesToWrapAround) {
    const MbAlignment pages(0xFFF, 0, 0);
    const MbAlignment offset(0, 0xFFF, 0x10);
    for (const auto& [alignment, address] : {std::pair(pages, END - 0xFFE), {offset, END}}) {
        try {
            (void)alignment.roundUpToAlignment(address);
            ADD_FAILURE() << "wrapped around";
        } catch (const MbEx::ExOutOfRange& refused) {
            EXPECT_STREQ(refused.what(),
                         "Out of range: Can't roundUpToAlignment() because of wrap-around.");
            EXPECT_STREQ(refused.getFile(), "src/resmgt/mbAlignment");
            EXPECT_EQ(refused.getLine(), 123);
        }
    }
    expectThrows<MbEx::ExOutOfRange>(
        "Out of range: Can't roundDownToAlignment() because of wrap-around.",
        [&] { (void)offset.roundDownToAlignment(0xF); });
    EXPECT_EQ(offset.roundDownToAlignment(0x10), 0x10u);
    EXPECT_EQ(pages.roundDownToAlignment(END), END - 0xFFF);
}

TEST(MbAlignment, takesOnlyMasksAndIsUnchangedByOthers) {
    const auto expectRefused = [](const char* detail, std::uint64_t mask) {
        const std::string reason = std::string("Invalid argument: ") + detail + ".";
        MbAlignment alignment(0xF, 0xFF, 0x20);
        expectThrows<MbEx::ExInvalidArgument>(reason, [&] { alignment.setAlignmentMask(mask); });
        expectThrows<MbEx::ExInvalidArgument>(reason, [&] { alignment.setOffsetMask(mask); });
        EXPECT_EQ(alignment, MbAlignment(0xF, 0xFF, 0x20));
        expectThrows<MbEx::ExInvalidArgument>(reason, [&] { MbAlignment(mask, 0, 0); });
        expectThrows<MbEx::ExInvalidArgument>(reason, [&] { MbAlignment(0, mask, 0); });
    };
    expectRefused("Argument is not a power of 2 minus 1", 2);
    expectRefused("Argument is not a power of 2 minus 1", END - 1);
    expectRefused("Zero is not a power of two", END);
}

TEST(MbAlignment, compoundMeetsBothDemandsOrRefuses) {
    struct Case {
        int line;
        MbAlignment first, second;
        std::optional<std::uint64_t> next;  // the first address from 0x10001 on; none: refused
    };
    const Case cases[] = {
        {__LINE__, {0xF, 0, 0}, {0xFF, 0, 0}, 0x10100},
        {__LINE__, {0xF, 0, 0}, {0, 0xFF, 0x20}, 0x10020},
        {__LINE__, {0, 0xF, 3}, {0, 0xFF, 0x23}, 0x10023},
        {__LINE__, {0xF, 0xFF, 0x23}, {0, 0xFF, 0x20}, 0x10020},
        {__LINE__, {0, 0xF, 3}, {0, 0xFF, 0x24}, {}},  // patterns
        {__LINE__, {0xF, 0, 0}, {0, 0xFF, 0x21}, {}},  // zero bits against a pattern
        {__LINE__, {0xFF, 0, 0}, {0, 0xFF, 0x80}, {}},
        {__LINE__, {0xF, 0xFFF, 0x120}, {0x7F, 0, 0}, {}},
    };
    for (const Case& c : cases) {
        for (const bool isSwapped : {false, true}) {
            SCOPED_TRACE(testing::Message() << c.line << (isSwapped ? " swapped" : ""));
            const MbAlignment& other = isSwapped ? c.first : c.second;
            const MbAlignment before = isSwapped ? c.second : c.first;
            MbAlignment alignment = before;
            if (!c.next) {
                expectThrows<MbEx::ExInvalidArgument>("Invalid argument: Incompatible offsets..",
                                                      [&] { alignment.compound(other); });
                EXPECT_EQ(alignment, before);
                continue;
            }
            alignment.compound(other);
            EXPECT_EQ(alignment.roundUpToAlignment(0x10001), *c.next);
            EXPECT_TRUE(c.first.isAligned(*c.next));
            EXPECT_TRUE(c.second.isAligned(*c.next));
        }
    }
}

}  // namespace

}  // namespace Orv

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <memory>
#include <sstream>

#include "expectThrows.h"
#include "lgSink.h"
#include "priority.h"
#include "priorityEx.h"
#include "priorityMgr.h"
#include "priorityRelation.h"
#include "rtPriorities.h"
#include "traceManager.h"

namespace Orv {

namespace {

using testing::HasSubstr;
using testing::Not;
using Relation = PriorityRelation;

std::string dumpOf(const auto& object) {
    std::ostringstream stream;
    object.dump(stream);
    return stream.str();
}

TEST(PriorityMgr, derivesNumbersAndFollowsEveryChange) {
    PriorityMgr mgr("mgr", 0, 31);
    Priority a("a", mgr), b("b", mgr), fixed("fixed", mgr, 10);
    EXPECT_TRUE(a.isIndependantButNotSet());
    EXPECT_EQ(a.getPriority(), 0);
    {
        const PriorityRelation below("a<b", a, Relation::LESS, b);
        EXPECT_EQ(a.getPriority(), 0);
        EXPECT_EQ(b.getPriority(), 1);
        EXPECT_TRUE(below.check());
        EXPECT_FALSE(a.isTied() || b.isTied() || b.isIndependantButNotSet());
        {
            const PriorityRelation equal("b==fixed", b, Relation::EQUAL, fixed);
            EXPECT_EQ(b.getPriority(), 10);
            EXPECT_EQ(a.getPriority(), 9);
            EXPECT_TRUE(a.isTied() && b.isTied());
            fixed.setPriority(20);
            EXPECT_EQ(a.getPriority(), 19);
        }
        EXPECT_EQ(b.getPriority(), 1);
        EXPECT_FALSE(a.isTied());
        a.setPriority(5);
        EXPECT_EQ(b.getPriority(), 6);
        a.setPriority(Priority::DERIVED);
        EXPECT_EQ(b.getPriority(), 1);
    }
    EXPECT_EQ(b.getPriority(), 0);
    EXPECT_TRUE(b.isIndependantButNotSet());
    EXPECT_FALSE(fixed.isIndependantButNotSet());
}

TEST(PriorityMgr, raisesAsLongAsTheContradictionStandsAndRecovers) {
    PriorityMgr mgr("mgr", 0, 31);
    Priority a("a", mgr), b("b", mgr), other("other", mgr, 7);
    const PriorityRelation first("a<b", a, Relation::LESS, b);
    EXPECT_EQ(b.getPriority(), 1);
    {
        const PriorityRelation second("b<a", b, Relation::LESS, a);
        for (int round = 0; round < 2; ++round) {
            EXPECT_EQ(mgr.check(), PriorityMgr::RELATION_INVALID);
            expectThrows<PriorityEx::ExRelationInvalid>(
                "Relation \"a<b\" invalid: \"a\" (0) <  \"b\" (0)", [&] { mgr.update(); });
            // Also for one that has nothing to do with it.
            EXPECT_THROW(static_cast<void>(other.getPriority()), PriorityEx::ExError);
            // The numbers of the last good update stand.
            EXPECT_TRUE(first.check());
            EXPECT_FALSE(second.check());
        }
    }
    EXPECT_EQ(mgr.check(), PriorityMgr::NONE);
    EXPECT_EQ(b.getPriority(), 1);
    EXPECT_EQ(other.getPriority(), 7);
}

TEST(PriorityMgr, namesTheCulpritWhateverItsName) {
    PriorityMgr mgr("mgr", 0, 3);
    const LiString longName(std::string(3000, 'x'));
    Priority low("100%s %n", mgr, 2), between("%d", mgr), high("b", mgr, 3);
    {
        const PriorityRelation above("%s%n", low, Relation::LESS, between);
        const PriorityRelation below("%%", between, Relation::LESS, high);
        EXPECT_EQ(mgr.check(), PriorityMgr::TRANSIENT_INVALID);
        expectThrows<PriorityEx::ExTransientInvalid>("Transient \"%d\" invalid: 3 2",
                                                     [&] { mgr.update(); });
        between.setName(longName);
        expectThrows<PriorityEx::ExTransientInvalid>(
            "Transient \"" + std::string(3000, 'x') + "\" invalid: 3 2",
            [&] { static_cast<void>(low.getPriority()); });
    }
    const PriorityRelation broken("%s%n", high, Relation::LESS_OR_EQUAL, low);
    try {
        mgr.update();
        FAIL() << "nothing was thrown";
    } catch (const PriorityEx::ExRelationInvalid& exception) {
        EXPECT_STREQ(exception.what(), "Relation \"%s%n\" invalid: \"b\" (3) <= \"100%s %n\" (2)");
        EXPECT_STREQ(exception.getFile(), "src/resmgt/priorityMgr");
    }
    EXPECT_THROW(mgr.update(), std::runtime_error);
}

TEST(PriorityMgr, findsRoomForAChainAsLongAsTheRangeAndForNoneLonger) {
    PriorityMgr mgr("mgr", 60, 63);
    std::vector<std::unique_ptr<Priority>> chain;
    std::vector<std::unique_ptr<PriorityRelation>> relations;
    const auto addOne = [&] {
        chain.push_back(std::make_unique<Priority>("chain", mgr));
        if (chain.size() == 1) return;
        Priority& upper = *chain[chain.size() - 1];
        relations.push_back(std::make_unique<PriorityRelation>("chain", *chain[chain.size() - 2],
                                                               Relation::LESS, upper));
    };
    for (int number = 60; number <= 63; ++number) addOne();
    for (int i = 0; i < 4; ++i) EXPECT_EQ(chain[i]->getPriority(), 60 + i);
    addOne();
    expectThrows<PriorityEx::ExTransientInvalid>("Transient \"chain\" invalid: 60 59",
                                                 [&] { mgr.update(); });
    chain[2].reset();  // takes its two relations with it
    EXPECT_EQ(chain[4]->getPriority(), 61);
}

TEST(PriorityMgr, tellsPrioritiesApartByIdentityNotByName) {
    PriorityMgr mgr("mgr", 0, 31);
    Priority lower("syncClient", mgr), upper("syncClient", mgr), third("syncClient", mgr);
    const PriorityRelation one("r", lower, Relation::LESS, upper);
    const PriorityRelation two("r", upper, Relation::LESS, third);
    EXPECT_EQ(lower.getPriority(), 0);
    EXPECT_EQ(upper.getPriority(), 1);
    EXPECT_EQ(third.getPriority(), 2);
}

TEST(PriorityMgr, letsPrioritiesAndRelationsGoInAnyOrder) {
    PriorityMgr mgr("mgr", 0, 31);
    auto a = std::make_unique<Priority>("a", mgr), b = std::make_unique<Priority>("b", mgr);
    auto left = std::make_unique<PriorityRelation>("left", *a, Relation::LESS, *b);
    auto self = std::make_unique<PriorityRelation>("self", *a, Relation::LESS, *a);
    EXPECT_EQ(mgr.check(), PriorityMgr::RELATION_INVALID);  // below itself
    a.reset();
    // Neither knows anything of the one that went, in whatever order the rest goes.
    EXPECT_TRUE(left->check() && self->check());
    EXPECT_THAT(dumpOf(*left), HasSubstr("inert"));
    EXPECT_TRUE(b->isIndependantButNotSet());
    EXPECT_EQ(b->getPriority(), 0);
    self.reset();
    b.reset();
    EXPECT_TRUE(left->check());
    mgr.add(*left);
    EXPECT_EQ(mgr.check(), PriorityMgr::NONE);
    left.reset();
    mgr.update();
}

TEST(PriorityMgr, aRemovedPriorityKeepsItsNumberAndMayComeBack) {
    PriorityMgr mgr("mgr", 0, 31);
    Priority a("a", mgr), b("b", mgr, 8);
    PriorityRelation below("a<b", a, Relation::LESS, b);
    EXPECT_EQ(a.getPriority(), 7);
    mgr.remove(below);
    mgr.remove(below);
    EXPECT_TRUE(a.isIndependantButNotSet());
    mgr.remove(a);
    mgr.remove(a);
    EXPECT_EQ(a.getPriority(), 7);
    expectAsserts("relation._left->_seat.isTaken() && relation._right->_seat.isTaken()",
                  [&] { PriorityRelation late("late", a, Relation::LESS, b); });
    mgr.add(a);
    mgr.add(a);
    EXPECT_EQ(a.getPriority(), 0);
}

TEST(PriorityMgr, aCopyHasNumberAndFlagButNoRelations) {
    PriorityMgr mgr("mgr", 0, 31);
    Priority fixed("fixed", mgr, 9), above("above", mgr);
    const PriorityRelation relation("r", fixed, Relation::LESS, above);
    EXPECT_EQ(above.getPriority(), 10);
    const Priority fixedCopy(fixed), derivedCopy(above);
    EXPECT_TRUE(fixedCopy.isFixed());
    EXPECT_FALSE(derivedCopy.isFixed());
    EXPECT_THAT(dumpOf(derivedCopy), HasSubstr("\"above\" 10"));
    EXPECT_EQ(fixedCopy.getPriority(), 9);
    EXPECT_EQ(derivedCopy.getPriority(), 0);
    fixed.setPriority(3);
    EXPECT_EQ(fixedCopy.getPriority(), 9);
}

TEST(PriorityMgr, refusesWhatIsAProgrammingError) {
    PriorityMgr mgr("mgr", 0, 31), other("other", 0, 31);
    Priority a("a", mgr), b("b", other);
    expectAsserts("&left.getMgr() == &right.getMgr()",
                  [&] { PriorityRelation("r", a, Relation::LESS, b); });
    expectAsserts("kind == EQUAL || kind == LESS || kind == LESS_OR_EQUAL",
                  [&] { PriorityRelation("r", a, PriorityRelation::Relation(3), a); });
    expectAsserts("&priority._mgr == this", [&] { mgr.add(b); });
    expectAsserts("min <= max", [] { PriorityMgr("empty", 1, 0); });
    EXPECT_THROW(PriorityRelation::relationToString(PriorityRelation::Relation(3)), ProgramAborted);
    EXPECT_STREQ(PriorityRelation::relationToString(Relation::LESS), "< ");

    auto* const outlived = new PriorityMgr("outlived", 0, 31);
    // Not to be destroyed any more; static, so that it counts as no leak.
    [[maybe_unused]] static const Priority* const left = new Priority("left", *outlived);
    expectAsserts("_priorities.empty()", [&] { delete outlived; });
}

TEST(PriorityMgr, dumpShowsWhoDependsOnWhomAndWhatIsWrong) {
    PriorityMgr mgr("threads", 0, 63);
    RtPriorities rt(mgr);
    Priority gen("gen", mgr), client("client", mgr), twin("twin", mgr), alone("alone", mgr);
    const PriorityRelation one("rt<sync-gen", rt.getRealTime(), Relation::LESS, gen);
    const PriorityRelation two("client<=gen", client, Relation::LESS_OR_EQUAL, gen);
    const PriorityRelation three("twin==gen", twin, Relation::EQUAL, gen);
    EXPECT_THAT(dumpOf(mgr), HasSubstr("\"threads\" 0..63 NOT UP TO DATE\n"));
    mgr.update();
    EXPECT_EQ(dumpOf(mgr),
              "PriorityMgr \"threads\" 0..63\n"
              "Priorities:\n"
              "  \"BaseLine\" 16 fixed\n"
              "    Independant: in no relation\n"
              "  \"RealTime\" 32 fixed\n"
              "    DependOns: < \"gen\" (33)\n"
              "  \"Interrupt\" 48 fixed\n"
              "    Independant: in no relation\n"
              "  \"gen\" 33 tied\n"
              "    Equals: == \"twin\" (33)\n"
              "    Dependants: > \"RealTime\" (32), >= \"client\" (33)\n"
              "  \"client\" 33 tied\n"
              "    DependOns: <= \"gen\" (33)\n"
              "  \"twin\" 33 tied\n"
              "    Equals: == \"gen\" (33)\n"
              "  \"alone\" 0\n"
              "    Independant: in no relation\n"
              "Relations: \n"
              "  \"rt<sync-gen\": lhs \"RealTime\" (32) <  rhs \"gen\" (33) valid\n"
              "  \"client<=gen\": lhs \"client\" (33) <= rhs \"gen\" (33) valid\n"
              "  \"twin==gen\": lhs \"twin\" (33) == rhs \"gen\" (33) valid\n");

    const PriorityRelation wrong("gen<client", gen, Relation::LESS, client);
    EXPECT_NE(mgr.check(), PriorityMgr::NONE);
    const std::string text = dumpOf(mgr);
    EXPECT_THAT(text, HasSubstr("0..63 NOT UP TO DATE\nRelation \"gen<client\" invalid: "));
    EXPECT_THAT(text,
                HasSubstr("\"gen<client\": lhs \"gen\" (33) <  rhs \"client\" (33) NOT valid"));
    EXPECT_THAT(dumpOf(rt), HasSubstr("rt-process-scope\n  \"BaseLine\" 16 fixed\n"));
}

TEST(PriorityRelation, computesTheNumberNextToTheOtherSide) {
    PriorityMgr mgr("mgr", 0, 31);
    Priority a("a", mgr), b("b", mgr);
    const PriorityRelation less("<", a, Relation::LESS, b);
    const PriorityRelation lessOrEqual("<=", a, Relation::LESS_OR_EQUAL, b);
    const PriorityRelation equal("==", a, Relation::EQUAL, b);
    EXPECT_EQ(less.computeLhsPriority(5), 4);
    EXPECT_EQ(less.computeRhsPriority(5), 6);
    EXPECT_EQ(lessOrEqual.computeLhsPriority(5), 5);
    EXPECT_EQ(lessOrEqual.computeRhsPriority(5), 5);
    EXPECT_EQ(equal.computeLhsPriority(5), 5);
    EXPECT_EQ(equal.computeRhsPriority(5), 5);
    EXPECT_THROW(less.computeRhsPriority(std::numeric_limits<int>::max()), AssertionFailed);
    EXPECT_THROW(less.computeLhsPriority(std::numeric_limits<int>::min()), AssertionFailed);
}

/// Keeps what is traced.
class CollectingSink : public LgSink {
public:
    std::string text;

    void write(const LgRecord& record, const LgThread&) override { text += record.text; }
    std::string getName() const override { return "collector"; }
};

TEST(PriorityMgr, tracesTheNumbersWhenTheyChange) {
    const auto sink = std::make_shared<CollectingSink>();
    TraceManager& tracing = TraceManager::getInstance();
    tracing.setStandardErrorOn(false);
    tracing.addSink(sink);
    PriorityMgr mgr("mgr", 0, 31);
    Priority a("a", mgr);
    mgr.update();
    mgr.enableTracing(true);
    mgr.update();
    tracing.flush();
    EXPECT_EQ(sink->text, "");
    Priority lower("lower", mgr);
    const PriorityRelation below("lower<a", lower, Relation::LESS, a);
    mgr.update();
    tracing.flush();
    EXPECT_THAT(sink->text, HasSubstr("\"lower<a\": lhs \"lower\" (0) <  rhs \"a\" (1) valid"));
    tracing.removeSink(*sink);
    tracing.setStandardErrorOn(true);
}

/// Mends what does not fit by dropping a relation, or lets it be.
class MendingMgr : public PriorityMgr {
public:
    using PriorityMgr::PriorityMgr;

    PriorityRelation* expendable = nullptr;
    int nbErrors = 0;

protected:
    void updateError(Error) override {
        ++nbErrors;
        if (expendable != nullptr) remove(*std::exchange(expendable, nullptr));
    }
};

TEST(PriorityMgr, aDerivedManagerMayMendAContradictionOrLetItBe) {
    MendingMgr mgr("mgr", 0, 31);
    Priority a("a", mgr), b("b", mgr);
    PriorityRelation below("a<b", a, Relation::LESS, b);
    EXPECT_EQ(b.getPriority(), 1);
    PriorityRelation above("b<a", b, Relation::LESS, a);
    EXPECT_EQ(b.getPriority(), 1);  // the last good number
    EXPECT_EQ(mgr.nbErrors, 1);
    mgr.expendable = &below;
    EXPECT_EQ(a.getPriority(), 1);
    EXPECT_EQ(mgr.nbErrors, 2);
    EXPECT_EQ(mgr.check(), PriorityMgr::NONE);
}

}  // namespace

}  // namespace Orv

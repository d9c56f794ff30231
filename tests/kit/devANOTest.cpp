#include <gtest/gtest.h>

#include "devANOQueueEntry.h"
#include "rcEx.h"

namespace Orv {

namespace {

class CountingACO : public DevACO {
public:
    CountingACO(int& nbRun, int& nbGone) : _nbRun(nbRun), _nbGone(nbGone) {}
    ~CountingACO() override { ++_nbGone; }
    void performExecute() override {
        ++_nbRun;
        if (_nbRun < 0) throw std::runtime_error("completion failed");
    }

private:
    int& _nbRun;
    int& _nbGone;
};

class EmptyANO : public DevANO {
public:
    void performExecute() override {}
};

TEST(DevANO, runsItsCompletionOnceAndLetsGoOfIt) {
    int nbRun = 0;
    int nbGone = 0;
    EmptyANO ano;
    ano.notify();  // nothing attached
    ano.setACO(ObjPtr<DevACO>(new CountingACO(nbRun, nbGone)));
    ano.notify();
    EXPECT_EQ(nbRun, 1);
    EXPECT_EQ(nbGone, 1);
    ano.notify();
    EXPECT_EQ(nbRun, 1);

    ano.setACO(ObjPtr<DevACO>(new CountingACO(nbRun, nbGone)));
    ano.setACO(ObjPtr<DevACO>(new CountingACO(nbRun, nbGone)));
    EXPECT_EQ(nbGone, 2) << "the replaced completion is destroyed, unrun";
    {
        const ObjPtr<DevACO> released = ano.releaseACO();
    }
    ano.notify();
    EXPECT_EQ(nbRun, 1);
    EXPECT_EQ(nbGone, 3);
}

TEST(DevANO, completionThatThrowsIsGoneAllTheSame) {
    int nbRun = -100;
    int nbGone = 0;
    EmptyANO ano;
    ano.setACO(ObjPtr<DevACO>(new CountingACO(nbRun, nbGone)));
    EXPECT_THROW(ano.notify(), std::runtime_error);
    EXPECT_EQ(nbGone, 1);
    ano.notify();
    EXPECT_EQ(nbRun, -99);
}

TEST(DevANOQueueEntry, hasOneOwner) {
    auto* const ano = new EmptyANO;
    DevANOQueueEntry first{ObjPtr<DevANO>(ano)};
    DevANOQueueEntry second(first);
    EXPECT_TRUE(first.isEmpty());
    DevANOQueueEntry third;
    third = second;
    EXPECT_TRUE(second.isEmpty());
    DevANOQueueEntry& same = third;
    third = same;
    const ObjPtr<DevANO> released = third.release();
    EXPECT_EQ(released.get(), ano);
    EXPECT_TRUE(third.isEmpty());
}

}  // namespace

}  // namespace Orv

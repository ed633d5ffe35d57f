#include "hostsvc/KSLocalMsgQueue.h"

#include <gmock/gmock.h>
#include <sys/resource.h>

#include "hostsvc/KSException.h"
#include "hostsvc/KSMsgRef.h"
#include "tests/support/fake_norv.h"

namespace {

using fake_norv::Op;
using testing::ElementsAre;

class KSLocalMsgQueueTest : public testing::Test {
  protected:
    KSLocalMsgQueueTest() {
        fake_norv::reset();
        getrlimit(RLIMIT_NOFILE, &before_);
    }
    ~KSLocalMsgQueueTest() override {
        setrlimit(RLIMIT_NOFILE, &before_);
        EXPECT_EQ(fake_norv::openQueues(), 0U);
        EXPECT_EQ(fake_norv::outstanding(), 0U);
        EXPECT_THAT(fake_norv::misuses(), ElementsAre());
    }

    void allow(rlim_t files) const {
        const rlimit limit{files, before_.rlim_max};
        setrlimit(RLIMIT_NOFILE, &limit);
    }
    static rlim_t allowed() {
        rlimit limit{};
        getrlimit(RLIMIT_NOFILE, &limit);
        return limit.rlim_cur;
    }

    rlimit before_{};
};

using KSLocalMsgQueueDeathTest = KSLocalMsgQueueTest;

TEST_F(KSLocalMsgQueueTest, ItHasTheAddressThatTheLibraryGives) {
    fake_norv::nextHostAddress({77, 1, 0, 2, 3, 4, 0});
    {
        const KSLocalMsgQueue queue({1, 1, 0, 1, 1, 1, 0}, 512, 5);
        EXPECT_TRUE(descComp(queue.getHostDesc(), {77, 1, 0, 2, 3, 4, 0}));
        EXPECT_THAT(fake_norv::texts(), ElementsAre("nvQueueOpen()", "nvQueueBind(100)"));
    }
}

TEST_F(KSLocalMsgQueueTest, ClosingWakesTheReaderWithAMessageToTheQueueItself) {
    fake_norv::nextHostAddress({77, 1, 0, 2, 3, 4, 0});
    { const KSLocalMsgQueue queue({}, 0, 0); }
    EXPECT_THAT(fake_norv::texts(),
                ElementsAre("nvQueueOpen()", "nvQueueBind(100)", "nvMsgAllocate(0)",
                            "nvMsgWrite(100, type 0x0)", "nvQueueUnbind(100, 0x4d)", "nvQueueClose(100)"));
    const fake_norv::Message woken = fake_norv::written().at(0);
    EXPECT_TRUE(descComp(woken.source, {77, 1, 0, 2, 3, 4, 0}));
    EXPECT_TRUE(descComp(woken.target, {77, 1, 0, 2, 3, 4, 0}));
    EXPECT_TRUE(woken.body.empty());
}

TEST_F(KSLocalMsgQueueTest, TheReaderIsWokenOnce) {
    {
        KSLocalMsgQueue queue({}, 0, 0);
        queue.wakeReader();
        queue.wakeReader();
        EXPECT_EQ(fake_norv::written().size(), 1U);
    }
    EXPECT_EQ(fake_norv::written().size(), 1U);
}

TEST_F(KSLocalMsgQueueTest, ClosingWithoutMemoryForTheWakeUpClosesAllTheSame) {
    {
        const KSLocalMsgQueue queue({}, 0, 0);
        fake_norv::fail(Op::allocate);
    }
    EXPECT_EQ(fake_norv::written().size(), 0U);
    EXPECT_EQ(fake_norv::count(Op::close), 1U);
}

TEST_F(KSLocalMsgQueueTest, ItWritesAndReadsMessages) {
    KSLocalMsgQueue queue({}, 0, 0);
    KSMsgRef msg(3U);
    msg.setMsgType(8);
    msg.setTgtAddr(queue.getHostDesc());
    EXPECT_EQ(queue.msgWrite(msg.getMsgRef()), 0U);
    NvMsg32Bit* read = nullptr;
    EXPECT_EQ(queue.msgRead(&read), 0U);
    EXPECT_EQ(fake_norv::calls(Op::read).front().text, "nvMsgRead(100, 0)");
    KSMsgRef back(read);
    EXPECT_EQ(back.getMsgType(), 8U);
    EXPECT_EQ(back.getSize(), 3U);
    back.free();

    fake_norv::fail(Op::read);
    EXPECT_EQ(queue.msgRead(&read), NVSTATUS_ERROR);
    fake_norv::fail(Op::write);
    EXPECT_EQ(queue.msgWrite(KSMsgRef(0U).getMsgRef()), NVSTATUS_ERROR);
}

TEST_F(KSLocalMsgQueueTest, AnOpenThatFailsIsTriedOnceMoreWithSixtyMoreFiles) {
    allow(256);
    fake_norv::fail(Op::open);
    const KSLocalMsgQueue queue({}, 0, 0);
    EXPECT_EQ(allowed(), 316U);
    EXPECT_EQ(fake_norv::count(Op::open), 2U);
}

TEST_F(KSLocalMsgQueueTest, ABindThatFailsIsTriedOnceMoreWithSixtyMoreFiles) {
    allow(256);
    fake_norv::fail(Op::bind);
    const KSLocalMsgQueue queue({}, 0, 0);
    EXPECT_EQ(allowed(), 316U);
    EXPECT_EQ(fake_norv::count(Op::bind), 2U);
}

TEST_F(KSLocalMsgQueueTest, TheLimitGoesNoFurtherThanTheHardOne) {
    allow(before_.rlim_max);
    fake_norv::fail(Op::open);
    const KSLocalMsgQueue queue({}, 0, 0);
    EXPECT_EQ(allowed(), before_.rlim_max);
}

TEST_F(KSLocalMsgQueueTest, ASecondOpenThatFailsThrows) {
    allow(256);
    fake_norv::fail(Op::open, 2);
    EXPECT_THROW(KSLocalMsgQueue({}, 0, 0), KSResource_CreationError);
    EXPECT_EQ(allowed(), 316U);
    EXPECT_THAT(fake_norv::texts(), ElementsAre("nvQueueOpen()", "nvQueueOpen()"));
}

TEST_F(KSLocalMsgQueueTest, ASecondBindThatFailsClosesTheQueueAndThrows) {
    fake_norv::fail(Op::bind, 2);
    EXPECT_THROW(KSLocalMsgQueue({}, 0, 0), KSResource_CreationError);
    EXPECT_THAT(fake_norv::texts(),
                ElementsAre("nvQueueOpen()", "nvQueueBind(100)", "nvQueueBind(100)", "nvQueueClose(100)"));
}

TEST_F(KSLocalMsgQueueDeathTest, AnUnbindThatFailsEndsTheProcess) {
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    EXPECT_EXIT(
        {
            const KSLocalMsgQueue queue({}, 0, 0);
            fake_norv::fail(Op::unbind);
        },
        testing::KilledBySignal(SIGABRT),
        testing::HasSubstr("KSLocalMsgQueue:98: virtual KSLocalMsgQueue::~KSLocalMsgQueue(): Assertion "
                           "`nvQueueUnbind(hostQ,hostDesc)!=NVSTATUS_ERROR' failed.\n"));
}

TEST_F(KSLocalMsgQueueDeathTest, ACloseThatFailsEndsTheProcess) {
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    EXPECT_EXIT(
        {
            const KSLocalMsgQueue queue({}, 0, 0);
            fake_norv::fail(Op::close);
        },
        testing::KilledBySignal(SIGABRT),
        testing::HasSubstr("KSLocalMsgQueue:100: virtual KSLocalMsgQueue::~KSLocalMsgQueue(): Assertion "
                           "`nvQueueClose(hostQ)!=NVSTATUS_ERROR' failed.\n"));
}

}  // namespace

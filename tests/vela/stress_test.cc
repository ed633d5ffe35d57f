// Everything at once, for the sanitizers: what remains is that all ends and nothing is left over.
#include <thread>

#include "tests/vela/events.h"

namespace {

using fake_norv::Message;
using vela::Addressable;
using vela::CCS;
using vela::CompDesc_t;
using vela::EvtCallback;
using vela::Msg;
using vela::MsgBody;
using vela::StdResource;

void takesBody(Addressable*, unsigned int, MsgBody* body) { delete body; }
void takesMsg(Addressable*, Msg* msg) { delete msg; }
void throwsException(Addressable*, Msg* msg) {
    delete msg;
    throw vela::Exception("a callback that fails");
}
void throwsNumber(Addressable*, unsigned int, MsgBody* body) {
    delete body;
    throw 7;  // NOLINT(hicpp-exception-baseclass)
}

class StressTest : public EventTest {
  protected:
    static constexpr int rounds = 40;

    StressTest() {
        board_.script(18, [](const Message& m) {
            Octets body = m.body;
            body.resize(12);
            Message stranger = fake_norv::replyTo(m, 19, body);
            ++stranger.source.instance;
            fake_norv::deliver(stranger);
            fake_norv::deliver(fake_norv::replyTo(m, 19, body));
            if (m.body[0] % 4 == 0)
                fake_norv::deliver(fake_norv::replyTo(m, 19, body));  // and once more
        });
        board_.script(8, [](const Message& m) {
            fake_norv::deliver(fake_norv::replyTo(m, m.body[0] % 2 == 0 ? 9 : 0, m.body));
        });
    }

    // Messages from three sources, `n` of each kind.
    void send(unsigned int n) {
        Octets trace = fake_norv::words({2, 1, 1003, 1});
        trace.push_back('x');
        NvCompDesc source = ccs_->getTgtDesc().getNvCompDesc();
        const NvCompDesc to = host().getNvCompDesc();
        for (unsigned int i = 0; i < n; ++i) {
            source.instance = static_cast<std::uint16_t>(1 + i % 3);
            fake_norv::deliver({0, 32, source, to, trace});
            fake_norv::deliver({0, 21, source, to, fake_norv::words({1, 7, i})});
            fake_norv::deliver({0, 1001 + i % 5, source, to, {}});
        }
    }
    // Until all of the others have ended; no more than the reader can take.
    void pump() {
        while (!done_) {
            send(3);
            EXPECT_TRUE(fake_norv::waitForIdleReader());
        }
    }

    void request(unsigned int thread) {
        for (unsigned int i = 0; i < rounds; ++i) {
            CCS::MsgGetParmCmplt_t got;
            ccs_->GetParm(thread * 1000 + i, &got);
            EXPECT_EQ(got.Num, thread * 1000 + i);
            try {
                ccs_->SetParm(i, 1, nullptr);
                EXPECT_EQ(i % 2, 0U);
            } catch (const Addressable::UnexpectedMsg&) {
                EXPECT_EQ(i % 2, 1U);
            }
        }
    }

    void registerAndCancel() {
        for (int i = 0; i < rounds; ++i) {
            const unsigned int threadParam = i % 2 == 0 ? 0 : onDispatcher;
            ccs_->asyncRegisterEvtGroup(2, &takesBody, threadParam);
            ccs_->asyncRegisterEvtGroup(2, &takesMsg, threadParam);
            ccs_->asyncRegisterEvtGroup(2, &throwsNumber, 0);
            ccs_->asyncRegisterMsgType(1001, &throwsException, threadParam);
            std::this_thread::yield();
            ccs_->asyncCancelEvtGroup(2, &takesBody, threadParam);
            ccs_->asyncCancelEvtGroup(2);
            ccs_->asyncCancelMsgType(1001, &throwsException, threadParam);
            ccs_->asyncUnregisteredMsgType(&takesMsg, threadParam);
            ccs_->asyncUnregisteredEvtGroup(&takesMsg, threadParam);
        }
    }

    void wait() {
        for (int i = 0; i < rounds; ++i) {
            StdResource::MsgGetxParmsCmplt_t list;
            ccs_->asyncWaitMsg(21, &list, 0);
            EXPECT_EQ(list.Parms->length(), 1U);
            const auto never = ccs_->getNewMsgWait(9999);
            EXPECT_THROW(never->wait(nullptr, 1), EvtCallback::MsgWait::Timeout);
            const auto left = ccs_->getNewMsgWait(1002);  // goes as its message may come
        }
    }

    // Others on the same queue come and go while their messages arrive.
    void comeAndGo() {
        for (int i = 0; i < rounds; ++i) {
            CCS other(CompDesc_t(2, 1, 1, 0x15, 0), ccs_->getMsgQueue());
            other.asyncRegisterEvtGroup(2, &takesBody, i % 2 == 0 ? 0 : onDispatcher);
            other.asyncUnregisteredMsgType(&takesMsg, 0);
            CCS copy(other);
            std::this_thread::yield();
        }
    }

    std::atomic<bool> done_{false};
};

TEST_F(StressTest, RequestsEventsRegistrationsWaitersAndDestructionAtOnce) {
    ccs_->getMsgQueue()->unregisteredSource([](vela::MsgQueue*, Msg* msg) { delete msg; });
    ccs_->asyncUnregisteredMsgType(&takesMsg, 0);
    ccs_->asyncUnregisteredEvtGroup(&takesMsg, 0);
    std::thread pumping([this] { pump(); });
    std::vector<std::thread> threads;
    for (unsigned int t = 0; t < 3; ++t)
        threads.emplace_back([this, t] { request(t); });
    threads.emplace_back([this] { registerAndCancel(); });
    threads.emplace_back([this] { wait(); });
    threads.emplace_back([this] { comeAndGo(); });
    for (std::thread& thread : threads)
        thread.join();
    done_ = true;
    pumping.join();
    ccs_->asyncRegisterEvtGroup(2, &takesBody, 0);
    send(30);
    ccs_.reset();  // while messages still come
    EXPECT_EQ(fake_norv::outstanding(), 0U);
}

}  // namespace

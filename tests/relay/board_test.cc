// Boards, their commands and their events, twice: on the software board of this process, and through a relay.
#include <gmock/gmock.h>

#include <condition_variable>
#include <cstdlib>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "softboard/softboard.h"
#include "tests/relay/running_relay.h"
#include "vela/Board.h"
#include "vela/CCS.h"
#include "vela/vela.h"

namespace {

using Octets = std::vector<unsigned char>;
using Record = vela::CCS::EvtL2Trace_t;

constexpr unsigned traceParm = 10;
constexpr unsigned protocolParm = 7;

// Keeps what it is shown.
class Watcher : public vela::CallbackBase {
  public:
    void show(vela::Addressable* /*object*/, unsigned /*group*/, vela::MsgBody* body) {
        const std::unique_ptr<vela::MsgBody> owned(body);
        Octets octets;
        for (const unsigned char octet : dynamic_cast<Record&>(*body).List.value())
            octets.push_back(octet);
        const std::lock_guard lock(lock_);
        frames_.push_back(octets);
        changed_.notify_all();
    }

    std::vector<Octets> frames(std::size_t count) {
        std::unique_lock lock(lock_);
        changed_.wait_for(lock, std::chrono::seconds(30), [&] { return frames_.size() >= count; });
        return frames_;
    }

  private:
    std::mutex lock_;
    std::condition_variable changed_;
    std::vector<Octets> frames_;
};

class BoardOver : public testing::TestWithParam<bool> {
  protected:
    BoardOver() {
        static const bool ready = (vela::velaInit(), true);
        static_cast<void>(ready);
        softboard::reset(softboard::oneChannel(
            {{true, 0, {0x00, 0x01, 0x7f}}, {false, 0, {0x00, 0x01, 0x73}}, {false, 0, Octets(260, 0x55)}}));
        unsetenv("HOST");
        unsetenv("REMOTE_NORV");
        if (GetParam())
            setenv("REMOTE_NORV", relay_.emplace().host().c_str(), 1);
        board_.emplace(1U, nullptr);
        ccs_.emplace(board_->findInst(0x15, 0xFF, 1).getTgtDesc(), nullptr);
    }
    ~BoardOver() override {
        ccs_.reset();
        board_.reset();
        relay_.reset();
        unsetenv("REMOTE_NORV");
        EXPECT_EQ(softboard::balance(), "buffers outstanding 0, queues open 0");
    }

    std::optional<RunningRelay> relay_;
    std::optional<vela::Board> board_;
    std::optional<vela::CCS> ccs_;
};

TEST_P(BoardOver, ParametersAreReadAndSet) {
    vela::StdResource::MsgGetParmCmplt_t reply;
    ccs_->GetParm(protocolParm, &reply);
    EXPECT_EQ(reply.Val, 7U);
    ccs_->SetParm(traceParm, 1, nullptr);
    ccs_->GetParm(traceParm, &reply);
    EXPECT_EQ(reply.Val, 1U);
}

TEST_P(BoardOver, WhatTheBoardRefusesIsAnUnexpectedMessage) {
    EXPECT_THROW(ccs_->GetParm(4242, nullptr), vela::Addressable::UnexpectedMsg);
    EXPECT_THROW(board_->findComp(0x77, 1), vela::Addressable::UnexpectedMsg);
    vela::StdResource::MsgGetParmCmplt_t reply;
    ccs_->GetParm(protocolParm, &reply);  // and the next is answered
    EXPECT_EQ(reply.Val, 7U);
}

TEST_P(BoardOver, EventsReachTheirReceiver) {
    Watcher watcher;
    ccs_->asyncRegisterEvtGroup(vela::CCS::l2TraceGroup, vela::Handler(&watcher, &Watcher::show), 0);
    ccs_->DetectEvt(vela::CCS::l2TraceGroup, 0, nullptr);
    ccs_->SetParm(traceParm, 1, nullptr);
    EXPECT_THAT(
        watcher.frames(3),
        testing::UnorderedElementsAre(Octets{0x00, 0x01, 0x7f}, Octets{0x00, 0x01, 0x73}, Octets(260, 0x55)));
    ccs_->CancelEvt(vela::CCS::l2TraceGroup, nullptr);
    ccs_.reset();
}

TEST_P(BoardOver, AnEventIsWaitedFor) {
    softboard::reset(softboard::oneChannel({{true, 0, {0x00, 0x01, 0x7f}}}));
    const auto waiter = ccs_->getNewEvtWait(vela::CCS::l2TraceGroup);
    ccs_->DetectEvt(vela::CCS::l2TraceGroup, 0, nullptr);
    ccs_->SetParm(traceParm, 1, nullptr);
    Record record;
    waiter->wait(&record, 30000);
    EXPECT_EQ(record.Direction, 1U);
    EXPECT_EQ(record.Length, 3U);
    ccs_->CancelEvt(vela::CCS::l2TraceGroup, nullptr);
}

TEST_P(BoardOver, ObjectsComeAndGo) {
    for (int round = 0; round < 20; ++round) {
        vela::CCS other(ccs_->getTgtDesc(), nullptr);
        vela::StdResource::MsgGetParmCmplt_t reply;
        other.GetParm(protocolParm, &reply);
        EXPECT_EQ(reply.Val, 7U);
    }
}

INSTANTIATE_TEST_SUITE_P(Over, BoardOver, testing::Bool(), [](const auto& each) {
    return std::string(each.param ? "TheRelay" : "TheLocalQueue");
});

}  // namespace

// An object whose trace records are a slow callback's, in a lane.
#ifndef TESTS_VELA_LANES_H
#define TESTS_VELA_LANES_H

#include <algorithm>
#include <condition_variable>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "tests/vela/events.h"
#include "vela/Lane.h"

namespace lanes {

using vela::Addressable;
using vela::CCS;
using vela::Lane;
using vela::Msg;
using vela::MsgBody;

constexpr unsigned int group = 2;

// A callback that lasts until it may end, and what it was given.
class Slow : public vela::EvtCallback::Callback {
  public:
    struct Given {
        unsigned int timestamp;
        MsgBody::Arrival arrival;
        std::thread::id thread;
    };

    void onTrace(Addressable*, unsigned int, MsgBody* raw) {
        const std::unique_ptr<MsgBody> body(raw);
        std::unique_lock guard(lock_);
        given_.push_back(
            {dynamic_cast<CCS::EvtL2Trace_t&>(*body).Timestamp, body->arrival(), std::this_thread::get_id()});
        most_ = std::max(most_, ++running_);
        changed_.notify_all();
        changed_.wait(guard, [this] { return mayEnd_ > 0; });
        --mayEnd_;
        --running_;
    }
    void onMsg(Addressable* owner, Msg* raw) {
        const std::unique_ptr<Msg> msg(raw);
        onTrace(owner, 0, std::make_unique<CCS::EvtL2Trace_t>().release());
    }

    // So many of them end, those that run first.
    void letEnd(unsigned int callbacks) {
        const std::lock_guard guard(lock_);
        mayEnd_ += callbacks;
        changed_.notify_all();
    }
    // The first n, by their time stamps, when so many have begun.
    std::vector<Given> given(std::size_t n) {
        std::unique_lock guard(lock_);
        EXPECT_TRUE(changed_.wait_for(guard, std::chrono::seconds(30), [&] { return given_.size() >= n; }));
        std::vector<Given> all = given_;
        std::sort(all.begin(), all.end(),
                  [](const Given& a, const Given& b) { return a.timestamp < b.timestamp; });
        return all;
    }
    unsigned int most() {
        const std::lock_guard guard(lock_);
        return most_;
    }

  private:
    std::mutex lock_;
    std::condition_variable changed_;
    std::vector<Given> given_;
    unsigned int mayEnd_ = 0;
    unsigned int running_ = 0;
    unsigned int most_ = 0;
};

constexpr unsigned int all = 1000000;

class LaneTest : public EventTest {
  protected:
    ~LaneTest() override {
        slow_.letEnd(all);
        end();
    }

    // Trace records from here on are the slow callback's, in a lane with these bounds.
    void traceInto(const Lane::Bounds& bounds) { traceInto(std::make_shared<Lane>(bounds)); }
    void traceInto(std::shared_ptr<Lane> lane) {
        lane_ = std::move(lane);
        ccs_->asyncRegisterEvtGroup(group, vela::Handler(&slow_, &Slow::onTrace), 0, lane_);
    }
    void sendTraces(unsigned int first, unsigned int count, unsigned int octets = 0) {
        for (unsigned int i = first; i < first + count; ++i) {
            Octets data = fake_norv::words({1, i, octets});
            data.resize(data.size() + octets);
            ASSERT_TRUE(sendEvent(group, data));
        }
    }

    // What the program said once every delivery's thread has ended: a thread says what was lost after its
    // delivery is gone.
    std::string said() {
        end();
        while (lane_.use_count() > 1)
            std::this_thread::yield();
        return errors_.text();
    }

    Slow slow_;
    std::shared_ptr<Lane> lane_;
};

}  // namespace lanes

#endif

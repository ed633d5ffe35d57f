// An object on the scripted transport, and what its callbacks were given.
#ifndef TESTS_VELA_EVENTS_H
#define TESTS_VELA_EVENTS_H

#include <thread>

#include "tests/vela/transport.h"
#include "vela/CCS.h"
#include "vela/StdResource.h"

// What callbacks were given, a line each: "body 32 {...}" or "message 32 4 octets". Takes over what they own.
class Recorder : public vela::EvtCallback::Callback {
  public:
    struct Entry {
        std::string text;
        vela::Addressable* owner;
        std::thread::id thread;
    };

    void onBody(vela::Addressable* owner, unsigned int type, vela::MsgBody* raw) {
        const std::unique_ptr<vela::MsgBody> body(raw);
        add("body " + std::to_string(type) + " " + printed(*body), owner);
    }
    void onMsg(vela::Addressable* owner, vela::Msg* raw) {
        const std::unique_ptr<vela::Msg> msg(raw);
        add("message " + std::to_string(msg->getMsgType()) + " " + std::to_string(msg->getSize()) + " octets",
            owner);
    }

    // The plain functions record here.
    static Recorder& functions() {
        static Recorder recorder;
        return recorder;
    }
    static void bodyFunction(vela::Addressable* owner, unsigned int type, vela::MsgBody* body) {
        functions().onBody(owner, type, body);
    }
    static void msgFunction(vela::Addressable* owner, vela::Msg* msg) { functions().onMsg(owner, msg); }

    void add(std::string text, vela::Addressable* owner) {
        const std::lock_guard guard(lock_);
        entries_.push_back({std::move(text), owner, std::this_thread::get_id()});
        changed_.notify_all();
    }

    // The first n entries, when there are that many.
    std::vector<Entry> entries(std::size_t n) {
        std::unique_lock guard(lock_);
        EXPECT_TRUE(changed_.wait_for(guard, std::chrono::seconds(30), [&] { return entries_.size() >= n; }));
        return entries_;
    }
    std::vector<std::string> texts(std::size_t n) {
        std::vector<std::string> all;
        for (const Entry& entry : entries(n))
            all.push_back(entry.text);
        return all;
    }
    void clear() {
        const std::lock_guard guard(lock_);
        entries_.clear();
    }

  private:
    std::mutex lock_;
    std::condition_variable changed_;
    std::vector<Entry> entries_;
};

class EventTest : public TransportTest {
  protected:
    static constexpr unsigned int onDispatcher = vela::EvtCallback::onDispatchingThread;
    static constexpr unsigned int replyType = 19;  // a message type that has a body
    // How the bodies and messages of sendReply and sendTrace print.
    static constexpr const char* replyBody = "body 19 {Num 7 Val 1001 TextSize 0 Text {}}";
    static constexpr const char* replyMessage = "message 19 12 octets";
    static constexpr const char* traceBody = "body 32 {Label 2 Direction 1 Timestamp 1003 Length 1 List {x}}";
    static constexpr const char* traceMessage = "message 32 17 octets";

    EventTest() { Recorder::functions().clear(); }

    vela::CompDesc_t host() const { return ccs_->getMsgQueue()->getHostDesc(); }
    // Sent, and taken off the queue by the dispatcher.
    bool send(std::uint32_t type, const Octets& body = {}) {
        return fake_norv::deliver(
                   {1001, type, ccs_->getTgtDesc().getNvCompDesc(), host().getNvCompDesc(), body}) &&
               fake_norv::waitForIdleReader();
    }
    bool sendReply() { return send(replyType, fake_norv::words({7, 1001, 0})); }
    bool sendEvent(std::uint32_t group, Octets data = {}) {
        Octets body = fake_norv::words({group});
        body.insert(body.end(), data.begin(), data.end());
        return send(32, body);
    }
    bool sendTrace() {
        Octets data = fake_norv::words({1, 1003, 1});
        data.push_back('x');
        return sendEvent(2, data);
    }
    // No callback runs any more, so that what they wrote can be looked at.
    void end() { ccs_.reset(); }

    ScriptedBoard board_;
    CapturedErrors errors_;
    Recorder recorder_;
    std::unique_ptr<vela::CCS> ccs_ =
        std::make_unique<vela::CCS>(vela::CompDesc_t(1, 1, 1, 0x15, 0), nullptr);
};

#endif

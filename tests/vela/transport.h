// What the tests of the object layer stand on: the scripted transport, with nothing left over at the end.
#ifndef TESTS_VELA_TRANSPORT_H
#define TESTS_VELA_TRANSPORT_H

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <map>
#include <memory>
#include <mutex>
#include <sstream>
#include <string>
#include <vector>

#include "tests/support/fake_norv.h"
#include "vela/Addressable.h"
#include "vela/Msg.h"

using Octets = std::vector<std::uint8_t>;

template <typename T>
std::string printed(const T& object) {
    std::ostringstream out;
    out << object;
    return out.str();
}

// Payload of a message.
inline Octets octetsOf(const vela::Msg& msg) {
    const auto* const body = reinterpret_cast<const std::uint8_t*>(msg.getNvMsgRef()) + NVMSG_HEADER_SIZE;
    return {body, body + msg.getSize()};
}

inline std::unique_ptr<vela::Msg> messageOf(const Octets& payload) {
    auto msg = std::make_unique<vela::Msg>(static_cast<unsigned int>(payload.size()));
    std::copy(payload.begin(), payload.end(),
              reinterpret_cast<std::uint8_t*>(msg->getNvMsgRef()) + NVMSG_HEADER_SIZE);
    return msg;
}

// 1, 2, 3, ... in octets.
inline Octets counted(std::size_t n) {
    Octets octets(n);
    for (std::size_t i = 0; i < n; ++i)
        octets[i] = static_cast<std::uint8_t>(i + 1);
    return octets;
}

// The body's calls of the transport, a line each: "@4 0x380000 0x380000" is a call of two fields at offset 4.
inline std::string fieldCalls(fake_norv::Op op) {
    std::ostringstream out;
    for (const fake_norv::Call& call : fake_norv::calls(op)) {
        out << "@" << call.offset;
        for (const std::uint32_t descriptor : call.descriptors)
            out << " 0x" << std::hex << descriptor << std::dec;
        EXPECT_EQ(call.count, call.descriptors.size());
        out << "\n";
    }
    return out.str();
}

// What was written into a message of the body's own size.
inline Octets encoded(vela::MsgBody& body) {
    vela::Msg msg(body.GetByteSize());
    EXPECT_EQ(msg.write(&body, 0), body.GetByteSize());
    return octetsOf(msg);
}

// Every buffer freed exactly once, every queue closed.
class TransportTest : public testing::Test {
  protected:
    TransportTest() { fake_norv::reset(); }
    ~TransportTest() override {
        EXPECT_EQ(fake_norv::outstanding(), 0U) << "buffers not freed";
        EXPECT_EQ(fake_norv::openQueues(), 0U);
        EXPECT_THAT(fake_norv::misuses(), testing::IsEmpty());
    }
};

// A board behind the scripted transport: answers commands by their type, at once.
class ScriptedBoard {
  public:
    ScriptedBoard() {
        fake_norv::onWrite([this](const fake_norv::Message& command) { react(command); });
    }
    ~ScriptedBoard() { fake_norv::onWrite({}); }
    ScriptedBoard(const ScriptedBoard&) = delete;
    ScriptedBoard& operator=(const ScriptedBoard&) = delete;

    // From now on a command of the type gets this reply.
    void answers(std::uint32_t command, std::uint32_t reply, Octets body = {}) {
        script(command, [reply, body](const fake_norv::Message& m) {
            fake_norv::deliver(fake_norv::replyTo(m, reply, body));
        });
    }
    void script(std::uint32_t command, std::function<void(const fake_norv::Message&)> action) {
        const std::lock_guard guard(lock_);
        actions_[command] = std::move(action);
    }

  private:
    void react(const fake_norv::Message& command) {
        std::function<void(const fake_norv::Message&)> action;
        {
            const std::lock_guard guard(lock_);
            if (const auto found = actions_.find(command.type); found != actions_.end())
                action = found->second;
        }
        if (action)
            action(command);
    }

    std::mutex lock_;
    std::map<std::uint32_t, std::function<void(const fake_norv::Message&)>> actions_;
};

// What the program writes to its standard error stream, from any thread.
class CapturedErrors {
  public:
    CapturedErrors() { testing::internal::CaptureStderr(); }
    ~CapturedErrors() {
        if (!taken_)
            testing::internal::GetCapturedStderr();
    }
    CapturedErrors(const CapturedErrors&) = delete;
    CapturedErrors& operator=(const CapturedErrors&) = delete;

    // Once, when all has been written.
    std::string text() {
        taken_ = true;
        return testing::internal::GetCapturedStderr();
    }

  private:
    bool taken_ = false;
};

// Somewhere to wait for `n` things to have happened on other threads.
class Signal {
  public:
    void raise() {
        const std::lock_guard guard(lock_);
        ++count_;
        changed_.notify_all();
    }
    bool wait(unsigned n = 1) {
        std::unique_lock guard(lock_);
        return changed_.wait_for(guard, std::chrono::seconds(30), [&] { return count_ >= n; });
    }

  private:
    std::mutex lock_;
    std::condition_variable changed_;
    unsigned count_ = 0;
};

#endif

// Waiters, each of which waits for one message of a type or one event of a group.
//
// A waiter is a mutex that is used as a signal: it is locked when the waiter is enabled, and the delivery
// that brings the message unlocks it.
#ifndef VELA_EVTWAIT_H
#define VELA_EVTWAIT_H

#include <atomic>
#include <memory>
#include <ostream>

#include "vela/EvtCallback.h"
#include "vela/StreamFlags.h"

namespace vela {

// The base class of the two kinds of waiter. They differ in whether they are registered by message type or by
// event group.
class Waiter : public Mutex, public EvtCallback::Callback {
  public:
    class Timeout : public Exception {
      public:
        Timeout(const char* name, unsigned int type, unsigned int timeoutMs)
            : Exception(name), type_(type), timeoutMs_(timeoutMs) {}
        unsigned int type() const { return type_; }
        unsigned int timeoutMs() const { return timeoutMs_; }
        // Writes the name, " Type: " in hexadecimal, and " Timeout: " in milliseconds.
        void toStream(std::ostream* out) const override;

      private:
        unsigned int type_;
        unsigned int timeoutMs_;
    };

    // Registers for the first message of the type or group that arrives from now on. These messages go to the
    // handler for messages without a registered callback: one that arrived before and that nobody waited for;
    // all after the first one; and the first one, if nobody has waited for it when the waiter is destroyed.
    void enable(unsigned int type);
    // Ends the registration. A callback that is running has ended when this returns.
    void disable();

    // Waits for the message, without limit if timeoutMs is 0, and reads it into body unless that is null.
    // Throws Timeout; a message that arrives after that can still be waited for.
    void wait(MsgBody* body, unsigned int timeoutMs);
    // The same, but returns the message, which the caller owns.
    Msg* waitMsg(unsigned int timeoutMs);

  protected:
    explicit Waiter(EvtCallback* dispatcher) : dispatcher_(dispatcher) {}
    ~Waiter() override = default;

    EvtCallback* dispatcher() const { return dispatcher_; }
    void trigger(Addressable* owner, Msg* msg);
    // Enables the waiter and waits for the message, which it keeps for the next wait. Throws Timeout.
    void enableAndAwait(unsigned int type, unsigned int timeoutMs);
    // Called by the destructors of derived classes: disables the waiter and drops the messages that it keeps.
    void end();

  private:
    void withdraw();
    std::unique_ptr<Msg> await(unsigned int timeoutMs);
    void handOnLateOne();

    virtual void add(unsigned int type) = 0;
    virtual void remove(unsigned int type) = 0;
    [[noreturn]] virtual void throwTimeout(unsigned int type, unsigned int timeoutMs) const = 0;

    enum State { Idle, Enabled, Triggered };

    EvtCallback* dispatcher_;
    unsigned int type_ = 0;
    std::atomic<Msg*> msg_{nullptr};  // the message that arrived, until a wait takes it
    std::unique_ptr<Msg> awaited_;    // the message that enableAndAwait keeps for the next wait
    std::atomic<State> state_{Idle};
};

class EvtCallback::MsgWait : public Waiter {
  public:
    class Timeout : public Waiter::Timeout {
      public:
        Timeout(unsigned int type, unsigned int timeoutMs)
            : Waiter::Timeout("EvtCallback::MsgWait::Timeout", type, timeoutMs) {}
    };

    explicit MsgWait(EvtCallback* dispatcher) : Waiter(dispatcher) {}
    // Enables the waiter and waits at once. Then wait or waitMsg returns the message. Throws Timeout.
    MsgWait(EvtCallback* dispatcher, unsigned int type, unsigned int timeoutMs);
    ~MsgWait() override { end(); }

  private:
    void add(unsigned int type) override;
    void remove(unsigned int type) override;
    [[noreturn]] void throwTimeout(unsigned int type, unsigned int timeoutMs) const override {
        throw Timeout(type, timeoutMs);
    }
};

class EvtCallback::EvtWait : public Waiter {
  public:
    class Timeout : public Waiter::Timeout {
      public:
        Timeout(unsigned int group, unsigned int timeoutMs)
            : Waiter::Timeout("EvtCallback::EvtWait::Timeout", group, timeoutMs) {}
    };

    explicit EvtWait(EvtCallback* dispatcher) : Waiter(dispatcher) {}
    EvtWait(EvtCallback* dispatcher, unsigned int group, unsigned int timeoutMs);
    ~EvtWait() override { end(); }

  private:
    void add(unsigned int group) override;
    void remove(unsigned int group) override;
    [[noreturn]] void throwTimeout(unsigned int group, unsigned int timeoutMs) const override {
        throw Timeout(group, timeoutMs);
    }
};

}  // namespace vela

#endif

// Waiters, each of which waits for one message of a type (EvtCallback::MsgWait) or one event of a group
// (EvtCallback::EvtWait).
//
// A waiter is a mutex that is used as a signal: it is locked when the waiter is enabled, and the delivery
// that brings the message unlocks it.
#ifndef VELA_EVTWAIT_H
#define VELA_EVTWAIT_H

#include <atomic>
#include <memory>

#include "vela/EvtCallback.h"

namespace vela {

// A waiter for a message of a type, or for an event of a group.
template <Awaited what>
class Waiter : public Mutex, public CallbackBase {
  public:
    class Timeout : public Exception {
      public:
        Timeout(unsigned int type, unsigned int timeoutMs)
            : Exception(what == Awaited::message ? "EvtCallback::MsgWait::Timeout"
                                                 : "EvtCallback::EvtWait::Timeout"),
              type_(type),
              timeoutMs_(timeoutMs) {}
        unsigned int type() const { return type_; }
        unsigned int timeoutMs() const { return timeoutMs_; }
        // Writes the name, " Type: " in hexadecimal, and " Timeout: " in milliseconds.
        void toStream(std::ostream* out) const override;

      private:
        unsigned int type_;
        unsigned int timeoutMs_;
    };

    explicit Waiter(EvtCallback* dispatcher) : dispatcher_(dispatcher) {}
    // Enables the waiter and waits at once. Then wait or waitMsg returns the message. Throws Timeout.
    Waiter(EvtCallback* dispatcher, unsigned int type, unsigned int timeoutMs);
    ~Waiter() override { end(); }

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

  private:
    void trigger(Addressable* owner, Msg* msg);
    void withdraw();
    void end();
    std::unique_ptr<Msg> await(unsigned int timeoutMs);

    enum State { idle, enabled, triggered };

    EvtCallback* dispatcher_;
    unsigned int type_ = 0;
    std::atomic<Msg*> msg_{nullptr};  // the message that arrived, until a wait takes it
    std::unique_ptr<Msg> awaited_;    // the message of a wait in the constructor, for the next wait
    std::atomic<State> state_{idle};
};

}  // namespace vela

#endif

// One-shot waiters for a message type or an event group.
//
// A waiter is a mutex used as a signal: taken when the waiter is enabled, released by the delivery that
// brings what it waits for.
#ifndef VELA_EVTWAIT_H
#define VELA_EVTWAIT_H

#include <atomic>
#include <memory>
#include <ostream>

#include "vela/EvtCallback.h"
#include "vela/StreamFlags.h"

namespace vela {

// What the two kinds of waiter share; they differ in the table they stand in.
class Waiter : public Mutex, public EvtCallback::Callback {
  public:
    class Timeout : public Exception {
      public:
        Timeout(const char* name, unsigned int type, unsigned int timeoutMs)
            : Exception(name), type_(type), timeoutMs_(timeoutMs) {}
        unsigned int type() const { return type_; }
        unsigned int timeoutMs() const { return timeoutMs_; }
        // The name, " Type: " in hexadecimal, " Timeout: " in milliseconds.
        void toStream(std::ostream* out) const override;

      private:
        unsigned int type_;
        unsigned int timeoutMs_;
    };

    // Stands registered for the type or group from now on, for the message that arrives first. One that came
    // before and that nobody waited for goes to the handler for what nobody registered for; so do those that
    // come after the first, and one that comes too late for a wait when the waiter goes.
    void enable(unsigned int type);
    // Registered no more; a callback that is on its way has ended when this returns.
    void disable();

    // Waits for what was enabled, with timeoutMs 0 for ever, and reads it into body unless that is null.
    // Throws Timeout; what comes after that can still be waited for.
    void wait(MsgBody* body, unsigned int timeoutMs);
    // The same, returning the message, which the caller owns.
    Msg* waitMsg(unsigned int timeoutMs);

  protected:
    explicit Waiter(EvtCallback* dispatcher) : dispatcher_(dispatcher) {}
    ~Waiter() override = default;

    EvtCallback* dispatcher() const { return dispatcher_; }
    void trigger(Addressable* owner, Msg* msg);
    // Enables for the type and waits for the message, which stays for a wait that follows. Throws Timeout.
    void enableAndAwait(unsigned int type, unsigned int timeoutMs);
    // For the derived destructors: as disable(), and nothing stays.
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
    std::atomic<Msg*> msg_{nullptr};  // what came, until somebody waits for it
    std::unique_ptr<Msg> awaited_;    // the waiting thread's, for the wait that follows
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
    // Enables for the type and waits at once; wait or waitMsg then hand out what came.
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

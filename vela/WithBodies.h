// The look-ups of a class that has messages of its own.
#ifndef VELA_WITHBODIES_H
#define VELA_WITHBODIES_H

#include <concepts>
#include <utility>

#include "vela/Body.h"

namespace vela {

// Base with the messages of a family. The look-ups search the tables of the family (Bodies, and Events if
// there is one), then those of Base.
template <typename Base, typename Messages>
class WithBodies : public Base, public Messages {
    static_assert(std::derived_from<Messages, Family<Messages>>);

  public:
    using Bodies = typename Messages::Bodies;

    MsgBody* MsgBodyLookup(unsigned int msgType) override {
        MsgBody* const body = Bodies::make(msgType);
        return body != nullptr ? body : Base::MsgBodyLookup(msgType);
    }
    MsgBody* EvtBodyLookup(unsigned int evtType) override {
        MsgBody* body = nullptr;
        if constexpr (requires { typename Messages::Events; })
            body = Messages::Events::make(evtType);
        return body != nullptr ? body : Base::EvtBodyLookup(evtType);
    }

    // Sends a prepared command of the family and waits for its reply, which it reads into `reply` unless that
    // is null. Without a `wait` it waits for the object's response time-out. Throws Addressable::Timeout,
    // Addressable::UnexpectedMsg.
    template <typename Cmd>
    void send(Cmd& cmd, typename Cmd::Reply* reply,
              typename Base::Wait wait = {}) requires(Bodies::template lists<Cmd>) {
        this->command(cmd, reply, wait);
    }

  protected:
    template <typename... Args>
    explicit WithBodies(Args&&... args) : Base(std::forward<Args>(args)...) {}
};

}  // namespace vela

#endif

// A message body: the fields of a message as an object, which writes itself into a payload and reads itself
// from one.
#ifndef VELA_MSGBODY_H
#define VELA_MSGBODY_H

#include <cstddef>
#include <cstdint>

#include "vela/virtualObject.h"

namespace vela {

class Msg;

class MsgBody : public virtualObject {
  public:
    // Both return the offset in the payload after the body.
    virtual unsigned int writeMsg(Msg* msg, unsigned int offset) = 0;
    virtual unsigned int readMsg(Msg* msg, unsigned int offset) = 0;
    // The size in octets when it is written.
    virtual unsigned int GetByteSize() const = 0;
    // The memory that it takes, in octets, with its lists.
    virtual std::size_t memorySize() const { return sizeof(MsgBody) + GetByteSize(); }

    // The number of the delivery among those of its registration, from 1 on, and how many deliveries were
    // lost directly before it. The dispatcher sets both; they are 0 in a body that did not come with a
    // delivery. They are not part of the message.
    struct Arrival {
        std::uint64_t number = 0;
        std::uint64_t missing = 0;
    };
    const Arrival& arrival() const { return arrival_; }
    void setArrival(const Arrival& arrival) { arrival_ = arrival; }

  protected:
    MsgBody() = default;
    MsgBody(const MsgBody&) = default;
    MsgBody& operator=(const MsgBody&) = default;

  private:
    Arrival arrival_;
};

}  // namespace vela

#endif

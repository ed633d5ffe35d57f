// What a message carries: an object that writes itself into a payload and reads itself out of one.
#ifndef VELA_MSGBODY_H
#define VELA_MSGBODY_H

#include <cstddef>
#include <cstdint>

#include "vela/virtualObject.h"

namespace vela {

class Msg;

class MsgBody : public virtualObject {
  public:
    // Both return the payload offset just past the body.
    virtual unsigned int writeMsg(Msg* msg, unsigned int offset) = 0;
    virtual unsigned int readMsg(Msg* msg, unsigned int offset) = 0;
    // The encoded size in octets.
    virtual unsigned int GetByteSize() const = 0;
    // Octets of memory that it takes, its lists included.
    virtual std::size_t memorySize() const { return sizeof(MsgBody) + GetByteSize(); }

    // Which one it was of all that one registration was given, from 1 on, and how many were lost right before
    // it. Set by the dispatcher, 0 for a body that came another way; no part of what the body says.
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

// What a message carries: an object that writes itself into a payload and reads itself out of one.
#ifndef VELA_MSGBODY_H
#define VELA_MSGBODY_H

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

  protected:
    MsgBody() = default;
    MsgBody(const MsgBody&) = default;
    MsgBody& operator=(const MsgBody&) = default;
};

}  // namespace vela

#endif

// A transport message, and the body that it was given, if any.
#ifndef VELA_MSG_H
#define VELA_MSG_H

#include <memory>

#include "hostsvc/KSMsgRef.h"
#include "norv/norv.h"
#include "vela/CompDesc.h"
#include "vela/MsgBody.h"

namespace vela {

// An object belongs to one thread at a time. It owns the transport message, the handle to it, and the body.
// The destructor frees the transport message unless a queue has taken it over; the handle is empty then.
class Msg : public virtualObject {
  public:
    // Makes a new transport message with `size` octets of payload. Throws KSMsgRef::AllocationError.
    explicit Msg(unsigned int size);
    // Takes over the transport message of `ref`, which becomes empty.
    explicit Msg(KSMsgRef* ref);
    // Copies header and payload into a new transport message. Does not copy the body.
    Msg(const Msg& other);
    Msg& operator=(const Msg&) = delete;
    ~Msg() override;

    unsigned int getMsgType() const;
    unsigned int getSize() const;  // of the payload, octets
    unsigned int getTrans() const;
    CompDesc_t getSrcAddr() const;
    CompDesc_t getTgtAddr() const;
    void setMsgType(unsigned int type);
    void setTrans(unsigned int trans);
    void setSrcAddr(const CompDesc_t& address);
    void setTgtAddr(const CompDesc_t& address);
    void realloc(unsigned int size);
    unsigned int fieldGet(unsigned int index, void* value);
    unsigned int fieldPut(unsigned int index, void* value);

    NvMsg32Bit* getNvMsgRef() const;
    KSMsgRef* getMsgRef() const { return ref_.get(); }

    // Both return the offset in the payload after the body.
    unsigned int write(MsgBody* body, unsigned int offset) { return body->writeMsg(this, offset); }
    unsigned int read(MsgBody* body, unsigned int offset) { return body->readMsg(this, offset); }
    // Gives the body to the message, which owns it from now on.
    void setBodyDef(MsgBody* body);

    // Writes header and payload. The payload is shown through the body, or as octets if there is none.
    void toStream(std::ostream* out) const override;

  private:
    std::unique_ptr<KSMsgRef> ref_;
    mutable std::unique_ptr<MsgBody> body_;  // toStream makes one if there is none
};

}  // namespace vela

#endif

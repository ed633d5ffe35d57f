// One transport message, with a body if it was given one.
#ifndef VELA_MSG_H
#define VELA_MSG_H

#include <memory>

#include "hostsvc/KSMsgRef.h"
#include "norv/norv.h"
#include "vela/CompDesc.h"
#include "vela/MsgBody.h"

namespace vela {

// Belongs to one thread at a time. Owns the transport message, its handle and the body: the destructor frees
// the transport message if the handle still refers to one, which it no longer does once a queue took it.
class Msg : public virtualObject {
  public:
    // A fresh transport message of `size` octets of payload. Throws KSMsgRef::AllocationError.
    explicit Msg(unsigned int size);
    // Takes over the transport message of `ref`, which is left empty.
    explicit Msg(KSMsgRef* ref);
    // Copies header and payload into a transport message of its own; the body is not copied.
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

    // Both return the payload offset just past the body.
    unsigned int write(MsgBody* body, unsigned int offset) { return body->writeMsg(this, offset); }
    unsigned int read(MsgBody* body, unsigned int offset) { return body->readMsg(this, offset); }
    // The message owns the body from now on.
    void setBodyDef(MsgBody* body);

    // Header and payload, decoded through the body; without one the payload's octets.
    void toStream(std::ostream* out) const override;

  private:
    std::unique_ptr<KSMsgRef> ref_;
    mutable std::unique_ptr<MsgBody> body_;  // made on demand for printing
};

}  // namespace vela

#endif

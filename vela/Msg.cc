#include "vela/Msg.h"

#include <cstring>
#include <ios>
#include <ostream>

#include "vela/MsgDefault.h"
#include "vela/StreamFlags.h"

namespace vela {

Msg::Msg(unsigned int size) : ref_(std::make_unique<KSMsgRef>(size)) {}

Msg::Msg(KSMsgRef* ref) : ref_(std::make_unique<KSMsgRef>(*ref)) { *ref = KSMsgRef(); }

Msg::Msg(const Msg& other) : virtualObject(other), ref_(std::make_unique<KSMsgRef>(other.ref_->clone())) {}

Msg::~Msg() {
    if (ref_->getMsgRef() != nullptr)
        ref_->free();
}

unsigned int Msg::getMsgType() const { return ref_->getMsgType(); }
unsigned int Msg::getSize() const { return ref_->getSize(); }
unsigned int Msg::getTrans() const { return ref_->getTrans(); }
CompDesc_t Msg::getSrcAddr() const { return CompDesc_t(ref_->getSrcAddr()); }
CompDesc_t Msg::getTgtAddr() const { return CompDesc_t(ref_->getTgtAddr()); }
void Msg::setMsgType(unsigned int type) { ref_->setMsgType(type); }
void Msg::setTrans(unsigned int trans) { ref_->setTrans(trans); }
void Msg::setSrcAddr(const CompDesc_t& address) { ref_->setSrcAddr(address.getNvCompDesc()); }
void Msg::setTgtAddr(const CompDesc_t& address) { ref_->setTgtAddr(address.getNvCompDesc()); }
void Msg::realloc(unsigned int size) { ref_->realloc(size); }
unsigned int Msg::fieldGet(unsigned int index, void* value) { return ref_->fieldGet(index, value); }
unsigned int Msg::fieldPut(unsigned int index, void* value) { return ref_->fieldPut(index, value); }
NvMsg32Bit* Msg::getNvMsgRef() const { return ref_->getMsgRef(); }

void Msg::setBodyDef(MsgBody* body) {
    if (body != body_.get())
        body_.reset(body);
}

void Msg::toStream(std::ostream* out) const {
    const StreamFlags saved(*out);
    if (body_ == nullptr)
        body_ = std::make_unique<MsgDefault_t>();
    *out << std::hex << std::showbase;
    *out << "{MsgType: " << getMsgType() << " Source: " << getSrcAddr() << " Target: " << getTgtAddr();
    *out << std::dec << " Size: " << getSize() << " Trans: " << getTrans() << std::hex << std::showbase;
    body_->readMsg(const_cast<Msg*>(this), 0);
    *out << " Body: " << *body_ << "}";
}

}  // namespace vela

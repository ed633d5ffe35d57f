#include "vela/MsgDefault.h"

#include <ostream>

#include "vela/Msg.h"
#include "vela/wire.h"

namespace vela {

unsigned int MsgDefault_t::writeMsg(Msg* msg, unsigned int offset) {
    FieldMover<Move::put> mover(msg->getNvMsgRef(), offset);
    mover.array(used_->begin(), used_->length(), WireType::unsigned8);
    return mover.offset();
}

unsigned int MsgDefault_t::readMsg(Msg* msg, unsigned int offset) {
    FieldMover<Move::get> mover(msg->getNvMsgRef(), offset);
    used_->realloc(mover.rest());
    mover.array(used_->begin(), used_->length(), WireType::unsigned8);
    return mover.offset();
}

void MsgDefault_t::toStream(std::ostream* out) const {
    *out << "{ByteData {";
    for (const unsigned char byte : *used_)
        *out << +byte << " ";
    *out << "}}";
}

}  // namespace vela

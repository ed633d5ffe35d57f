#include "vela/StdResourceMessages.h"

#include <ostream>

namespace vela {

using Messages = StdResourceMessages;

namespace {

constexpr bool isParameterCommand(unsigned int code) {
    return code == Messages::MsgSetParm_t::code || code == Messages::MsgSetxParms_t::code ||
           code == Messages::MsgGetParm_t::code || code == Messages::MsgGetxParms_t::code ||
           code == Messages::MsgGetVParm_t::code || code == Messages::MsgSetVParm_t::code;
}

}  // namespace

Messages::MsgError_t::MsgError_t(unsigned int& errorMsg, unsigned int& errorCode, Data_ErrorMsg_0x8_t& data)
    : Body(errorMsg, errorCode) {
    Data.bind(data);
}

bool Messages::MsgError_t::hasData() const { return isParameterCommand(ErrorMsg); }

unsigned int Messages::MsgError_t::writeMsg(Msg* msg, unsigned int offset) {
    offset = Body::writeMsg(msg, offset);
    return hasData() ? Data->writeMsg(msg, offset) : offset;
}

unsigned int Messages::MsgError_t::readMsg(Msg* msg, unsigned int offset) {
    offset = Body::readMsg(msg, offset);
    return hasData() ? Data->readMsg(msg, offset) : offset;
}

unsigned int Messages::MsgError_t::GetByteSize() const {
    return Body::GetByteSize() + (hasData() ? Data->GetByteSize() : 0);
}

void Messages::MsgError_t::toStream(std::ostream* out) const {
    *out << "{ErrorMsg " << ErrorMsg << " ErrorCode " << ErrorCode << " Data ";
    if (hasData())
        *out << Data.value();
    else
        *out << "NULL";
    *out << "}";
}

}  // namespace vela

#include "vela/StdResource.h"

#include <ostream>

#include "vela/ResourceMgr.h"

namespace vela {

MsgBody* StdResource::MsgBodyLookup(unsigned int msgType) {
    MsgBody* const body = Bodies::make(msgType);
    return body != nullptr ? body : superMsgBodyLookup(msgType);
}

void StdResource::use(unsigned int payload) { ResourceMgr(*this).use(getTgtDesc(), payload); }
void StdResource::unuse() { ResourceMgr(*this).unuse(getTgtDesc()); }
void StdResource::free() { ResourceMgr(*this).free(getTgtDesc()); }

void StdResource::SetParm(unsigned int parm, unsigned int value, MsgSetParmCmplt_t* reply) {
    command(MsgSetParm_t(parm, value), reply);
}

void StdResource::GetParm(unsigned int parm, MsgGetParmCmplt_t* reply) { command(MsgGetParm_t(parm), reply); }

void StdResource::DetectEvt(unsigned int evtType, unsigned int evtGroup, Addressable* returnTo) {
    MsgDetectEvt_t cmd;
    cmd.RetAddr = returnTo != nullptr ? returnTo->getTgtDesc() : getMsgQueue()->getHostDesc();
    cmd.EvtType = evtType;
    cmd.EvtGroup = evtGroup;
    command<MsgDetectEvtCmplt_t>(cmd, nullptr);
}

void StdResource::CancelEvt(unsigned int evtType, Addressable*) {
    command<MsgCancelEvtCmplt_t>(MsgCancelEvt_t(evtType), nullptr);
}

namespace {

constexpr bool isParameterCommand(unsigned int code) {
    return code == StdResource::MsgSetParm_t::code || code == StdResource::MsgSetxParms_t::code ||
           code == StdResource::MsgGetParm_t::code || code == StdResource::MsgGetxParms_t::code ||
           code == StdResource::MsgGetVParm_t::code || code == StdResource::MsgSetVParm_t::code;
}

}  // namespace

StdResource::MsgError_t::MsgError_t(unsigned int& errorMsg, unsigned int& errorCode,
                                    Data_ErrorMsg_0x8_t& data)
    : Body(errorMsg, errorCode) {
    Data.bind(data);
}

bool StdResource::MsgError_t::hasData() const { return isParameterCommand(ErrorMsg); }

unsigned int StdResource::MsgError_t::writeMsg(Msg* msg, unsigned int offset) {
    offset = Body::writeMsg(msg, offset);
    return hasData() ? Data->writeMsg(msg, offset) : offset;
}

unsigned int StdResource::MsgError_t::readMsg(Msg* msg, unsigned int offset) {
    offset = Body::readMsg(msg, offset);
    return hasData() ? Data->readMsg(msg, offset) : offset;
}

unsigned int StdResource::MsgError_t::GetByteSize() const {
    return Body::GetByteSize() + (hasData() ? Data->GetByteSize() : 0);
}

void StdResource::MsgError_t::toStream(std::ostream* out) const {
    *out << "{ErrorMsg " << ErrorMsg << " ErrorCode " << ErrorCode << " Data ";
    if (hasData())
        *out << Data.value();
    else
        *out << "NULL";
    *out << "}";
}

}  // namespace vela

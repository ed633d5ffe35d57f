#include "vela/CCS.h"

#include <algorithm>
#include <array>

namespace vela {

namespace rows {

bool IEPubData_t::isSingleOctet() const {
    constexpr std::array<unsigned char, 6> singles{144, 160, 161, 176, 191, 208};
    return std::find(singles.begin(), singles.end(), IEId.value()) != singles.end();
}

template <Move direction>
unsigned int IEPubData_t::move(Msg* msg, unsigned int offset) {
    FieldMover<direction> mover(msg->getNvMsgRef(), offset);
    mover.scalars(IEId);
    if (!isSingleOctet()) {
        mover.scalars(Length);
        Value.transfer(mover, msg, Length);
    }
    return mover.offset();
}

unsigned int IEPubData_t::writeMsg(Msg* msg, unsigned int offset) {
    Length.count(Value.length());
    return move<Move::Put>(msg, offset);
}

unsigned int IEPubData_t::readMsg(Msg* msg, unsigned int offset) {
    Length = 0;
    Value->realloc(0);
    return move<Move::Get>(msg, offset);
}

unsigned int IEPubData_t::GetByteSize() const { return isSingleOctet() ? 1 : Body::GetByteSize(); }

}  // namespace rows

MsgBody* CCS::MsgBodyLookup(unsigned int msgType) {
    MsgBody* const body = Bodies::make(msgType);
    return body != nullptr ? body : Component::MsgBodyLookup(msgType);
}

MsgBody* CCS::EvtBodyLookup(unsigned int evtType) {
    MsgBody* const body = Events::make(evtType);
    return body != nullptr ? body : Component::EvtBodyLookup(evtType);
}

void CCS::SendIE(unsigned short callRef, unsigned short callId, unsigned char messageId) {
    staticList<unsigned char> none;
    SendIE(callRef, callId, messageId, none);
}

void CCS::SendIE(unsigned short callRef, unsigned short callId, unsigned char messageId,
                 staticList<unsigned char>& privateData) {
    staticList<ieMessage_t::IEPubData_t> none;
    SendIE(callRef, callId, messageId, privateData, none);
}

void CCS::SendIE(unsigned short callRef, unsigned short callId, unsigned char messageId,
                 staticList<ieMessage_t::IEPubData_t>& elements) {
    staticList<unsigned char> none;
    SendIE(callRef, callId, messageId, none, elements);
}

void CCS::SendIE(unsigned short callRef, unsigned short callId, unsigned char messageId,
                 staticList<unsigned char>& privateData, staticList<ieMessage_t::IEPubData_t>& elements) {
    ieMessage_t message(callId, callRef, messageId, privateData, elements);
    SendIE(message);
}

}  // namespace vela

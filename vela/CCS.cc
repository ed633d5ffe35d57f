#include "vela/CCS.h"

#include <algorithm>
#include <array>

namespace vela {

namespace rows {

std::size_t IEPubData::fieldsPresent() const {
    constexpr std::array<unsigned char, 6> singles{144, 160, 161, 176, 191, 208};
    return std::find(singles.begin(), singles.end(), IEId.value()) != singles.end() ? 1 : 3;
}

}  // namespace rows

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

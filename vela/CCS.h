// The common-channel-signalling component, which runs a D channel and reports its layer-2 frames.
#ifndef VELA_CCS_H
#define VELA_CCS_H

#include "vela/Component.h"

namespace vela {

namespace rows {
// clang-format off
struct EvtL2Trace {
    U32<"Label"> Label; U32<"Direction"> Direction; U32<"Timestamp"> Timestamp; U32<"Length"> Length;
    RestBytes<"List"> List;
};
// One information element: an identifier, and unless the element has a single octet, a length and a value.
struct IEPubData {
    U8<"IEId"> IEId; Count8<"Length"> Length; Array<unsigned char, WireType::unsigned8, "Value"> Value;
    std::size_t fieldsPresent() const;
};
struct ieMessage {
    using IEPubData_t = Body<noCode, rows::IEPubData>;
    U16<"CallId"> CallId; U16<"CallRef"> CallRef; Count16<"IEPrivBufLen"> IEPrivBufLen;
    U8<"MessageId"> MessageId; Array<unsigned char, WireType::unsigned8, "IEPrivData"> IEPrivData;
    RestOf<IEPubData_t, "IEPubData"> IEPubData;
};
// clang-format on
}  // namespace rows

struct CCSMessages : Family<CCSMessages> {
    // A trace record. Label 2 is a frame. Direction is 1 for a frame that the board transmitted, any other
    // value for one that it received. Timestamp is in ticks of 4 ms, Length in octets; List may hold fewer.
    // clang-format off
    struct EvtL2Trace_t : Body<2, rows::EvtL2Trace> { using Body::Body; };
    // A call-control message: a call, and its private and public information elements. After reading, the
    // list of public elements has as many entries as there were octets; those after the last element are
    // empty.
    struct ieMessage_t : Body<5376, rows::ieMessage> { using Body::Body; };
    // clang-format on

    using Bodies = BodyTable<ieMessage_t>;
    using Events = BodyTable<EvtL2Trace_t>;  // by event group
};

class CCS : public WithBodies<Component, CCSMessages> {
  public:
    static constexpr unsigned int l2TraceGroup = EvtL2Trace_t::code;

    CCS(const CompDesc_t& target, MsgQueue* queue) : WithBodies(target, queue) {}
    ~CCS() override { endCallbacks(); }

    // Sends a call-control message. It has no reply, so the function waits for an error only. Throws
    // UnexpectedMsg.
    void SendIE(ieMessage_t& message) { command(message, Wait()); }
    void SendIE(unsigned short callRef, unsigned short callId, unsigned char messageId);
    void SendIE(unsigned short callRef, unsigned short callId, unsigned char messageId,
                staticList<unsigned char>& privateData);
    void SendIE(unsigned short callRef, unsigned short callId, unsigned char messageId,
                staticList<ieMessage_t::IEPubData_t>& elements);
    void SendIE(unsigned short callRef, unsigned short callId, unsigned char messageId,
                staticList<unsigned char>& privateData, staticList<ieMessage_t::IEPubData_t>& elements);

    void* userData = nullptr;  // for the application; the layer does not use it
};

}  // namespace vela

#endif

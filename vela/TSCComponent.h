// The telephony service component, which manages the lines and channels of trunks.
#ifndef VELA_TSCCOMPONENT_H
#define VELA_TSCCOMPONENT_H

#include "vela/Component.h"
#include "vela/described.h"

namespace vela {

namespace rows {
// clang-format off
// A parameter. Its FieldDef says how many elements its value has, and of which type.
struct ParmFieldDefVal { U32<"Parm"> Parm; Descriptor32<"FieldDef"> FieldDef; Described<"Val"> Val; };
struct Std_ParmValList {
    using Parms_t = Body<noCode, ParmVal>;
    Count32<"Count"> Count; ListOf<Parms_t, "Parms"> Parms;
};
struct Std_ParmFieldDefValList {
    using Parms_t = Body<noCode, ParmFieldDefVal>;
    Count32<"Count"> Count; ListOf<Parms_t, "Parms"> Parms;
};
struct BChannel { U8<"BChanId"> BChanId; U8<"SlotId"> SlotId; U8<"Direction"> Direction; U8<"Count"> Count; };
struct DefineBSet {
    using List_t = Body<noCode, BChannel>;
    U8<"SetId"> SetId; U8<"LineId"> LineId; U8<"StartChannelId"> StartChannelId; U8<"NumChannels"> NumChannels;
    U32<"BaseProtocol"> BaseProtocol; U8<"InboundVariantId"> InboundVariantId;
    U8<"OutboundVariantId"> OutboundVariantId; Nested<CompDesc_t, "DChannelDesc"> DChannelDesc;
    U32<"AdminGroup"> AdminGroup; Count8<"Width"> Width; ListOf<List_t, "List"> List;
};
struct LineMask { U8<"Linenum"> Linenum; U32<"Alarm_mask"> Alarm_mask; };
struct LineOnly { U8<"Linenum"> Linenum; };
struct PortOnly { U8<"port"> port; };
struct PortSignalBits { U8<"port"> port; FixedOctets<32, "signalbits"> signalbits; };
// clang-format on
}  // namespace rows

struct TSCMessages : Family<TSCMessages> {
    // clang-format off
    struct Std_MsgSetxParmsCmplt_t : Body<11> {};
    struct Std_MsgSetxParms_t : Command<10, Std_MsgSetxParmsCmplt_t, rows::Std_ParmFieldDefValList> { using Command::Command; };
    struct Std_MsgGetxParmsCmplt_t : Body<21, rows::Std_ParmFieldDefValList> { using Body::Body; };
    struct Std_MsgGetxParms_t : Command<20, Std_MsgGetxParmsCmplt_t, rows::Std_ParmValList> { using Command::Command; };
    struct MsgDefineBSetCmplt_t : Body<4617> {};
    struct MsgDefineBSet_t : Command<4616, MsgDefineBSetCmplt_t, rows::DefineBSet> { using Command::Command; };
    struct MsgSetAlarmMaskCmplt_t : Body<4675> {};
    struct MsgSetAlarmMask_t : Command<4674, MsgSetAlarmMaskCmplt_t, rows::LineMask> { using Command::Command; };
    struct MsgGetAlarmMaskCmplt_t : Body<4677, rows::LineMask> { using Body::Body; };
    struct MsgGetAlarmMask_t : Command<4676, MsgGetAlarmMaskCmplt_t, rows::LineOnly> { using Command::Command; };
    struct MsgTxRxSignalingGetAllCmplt_t : Body<4689, rows::PortSignalBits> { using Body::Body; };
    struct MsgTxRxSignalingGetAll_t : Command<4688, MsgTxRxSignalingGetAllCmplt_t, rows::PortOnly> { using Command::Command; };
    // clang-format on

    using Bodies = BodyTable<Std_MsgSetxParms_t, Std_MsgSetxParmsCmplt_t, Std_MsgGetxParms_t,
                             Std_MsgGetxParmsCmplt_t, MsgDefineBSet_t, MsgDefineBSetCmplt_t,
                             MsgSetAlarmMask_t, MsgSetAlarmMaskCmplt_t, MsgGetAlarmMask_t,
                             MsgGetAlarmMaskCmplt_t, MsgTxRxSignalingGetAll_t, MsgTxRxSignalingGetAllCmplt_t>;
};

// It has messages of its own for setting and getting several parameters, which replace the standard ones.
class TSCComponent : public WithBodies<Component, TSCMessages> {
  public:
    explicit TSCComponent(const Component& found) : WithBodies(found) {}
    ~TSCComponent() override { endCallbacks(); }

    // Commands. All throw Timeout, UnexpectedMsg. StdResource.h describes their forms.
    void SetxParms(Std_MsgSetxParms_t& cmd, Std_MsgSetxParmsCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void SetxParms(staticList<Std_MsgSetxParms_t::Parms_t>& parms, Std_MsgSetxParmsCmplt_t* reply,
                   Wait wait = {}) {
        command(Std_MsgSetxParms_t(parms), reply, wait);
    }
    void GetxParms(Std_MsgGetxParms_t& cmd, Std_MsgGetxParmsCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void GetxParms(staticList<Std_MsgGetxParms_t::Parms_t>& parms, Std_MsgGetxParmsCmplt_t* reply,
                   Wait wait = {}) {
        command(Std_MsgGetxParms_t(parms), reply, wait);
    }
    void DefineBSet(MsgDefineBSet_t& cmd, MsgDefineBSetCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void DefineBSet(unsigned char setId, unsigned char lineId, unsigned char startChannelId,
                    unsigned char numChannels, unsigned int baseProtocol, unsigned char inboundVariantId,
                    unsigned char outboundVariantId, CompDesc_t dChannel, unsigned int adminGroup,
                    staticList<MsgDefineBSet_t::List_t>& channels, MsgDefineBSetCmplt_t* reply,
                    Wait wait = {}) {
        command(MsgDefineBSet_t(setId, lineId, startChannelId, numChannels, baseProtocol, inboundVariantId,
                                outboundVariantId, dChannel, adminGroup, channels),
                reply, wait);
    }
    void SetAlarmMask(MsgSetAlarmMask_t& cmd, MsgSetAlarmMaskCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void SetAlarmMask(unsigned char line, unsigned int mask, MsgSetAlarmMaskCmplt_t* reply, Wait wait = {}) {
        command(MsgSetAlarmMask_t(line, mask), reply, wait);
    }
    void GetAlarmMask(MsgGetAlarmMask_t& cmd, MsgGetAlarmMaskCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void GetAlarmMask(unsigned char line, MsgGetAlarmMaskCmplt_t* reply, Wait wait = {}) {
        command(MsgGetAlarmMask_t(line), reply, wait);
    }
    void GetSignalBitsAll(MsgTxRxSignalingGetAll_t& cmd, MsgTxRxSignalingGetAllCmplt_t* reply,
                          Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void GetSignalBitsAll(unsigned char port, MsgTxRxSignalingGetAllCmplt_t* reply, Wait wait = {}) {
        command(MsgTxRxSignalingGetAll_t(port), reply, wait);
    }
};

}  // namespace vela

#endif

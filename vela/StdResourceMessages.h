// The messages that every component instance understands: rows of fields, and the bodies that are made of
// them. Numbers are 32 bits unsigned unless the field says otherwise; addresses are CompDesc_t.
#ifndef VELA_STDRESOURCEMESSAGES_H
#define VELA_STDRESOURCEMESSAGES_H

#include "vela/Body.h"
#include "vela/CompDesc.h"

namespace vela {

namespace rows {

// clang-format off
struct ParmVal    { U32<"Parm"> Parm; U32<"Val"> Val; };
struct ParmVarVal { U32<"Parm"> Parm; Value32<"Val"> Val; };
struct ParmOnly   { U32<"Parm"> Parm; };
struct NumOnly    { U32<"Num"> Num; };
struct NumVal     { U32<"Num"> Num; U32<"Val"> Val; };
struct TypeOnly   { U32<"Type"> Type; };
struct TypeGroup  { U32<"EvtType"> EvtType; U32<"EvtGroup"> EvtGroup; };
struct GroupOnly  { U32<"EvtGroup"> EvtGroup; };
struct GroupAction { U32<"EvtGroup"> EvtGroup; U32<"Action"> Action; };

// An error: the code of the command that failed, the component's error number, and for parameter commands the
// refused parameter and its value.
struct Error {
    U32<"ErrorMsg"> ErrorMsg; U32<"ErrorCode"> ErrorCode; Nested<Body<noCode, NumVal>, "Data"> Data;
    std::size_t fieldsPresent() const;
};

struct ParmValList {
    using Parms_t = Body<noCode, ParmVal>;
    Count32<"Count"> Count; ListOf<Parms_t, "Parms"> Parms;
};
struct ParmVarValList {
    using Parms_t = Body<noCode, ParmVarVal>;
    Count32<"Count"> Count; ListOf<Parms_t, "Parms"> Parms;
};
struct ParmList {
    using Parms_t = Body<noCode, ParmOnly>;
    Count32<"Count"> Count; ListOf<Parms_t, "Parms"> Parms;
};

struct GetParmCmplt {
    U32<"Num"> Num; U32<"Val"> Val; Count32<"TextSize"> TextSize;
    Rest<unsigned char, WireType::text8, "Text"> Text;
};

struct DetectEvt { Nested<CompDesc_t, "RetAddr"> RetAddr; U32<"EvtType"> EvtType; U32<"EvtGroup"> EvtGroup; };
struct DetectxEvts {
    using List_t = Body<noCode, TypeGroup>;
    Nested<CompDesc_t, "RetAddr"> RetAddr; Count32<"Count"> Count; ListOf<List_t, "List"> List;
};
struct CancelxEvts { Count32<"Count"> Count; Array<unsigned int, WireType::unsigned32, "EvtTypeList"> EvtTypeList; };
struct EvtDetected { U32<"EvtGroup"> EvtGroup; RestBytes<"Data"> Data; };

struct ArmxRTCs {
    using EventGroupList_t = Body<noCode, GroupAction>;
    Count32<"Count"> Count; ListOf<EventGroupList_t, "EventGroupList"> EventGroupList;
};
struct DisarmxRTCs {
    Count32<"Count"> Count; Array<unsigned int, WireType::unsigned32, "EventGroupList"> EventGroupList;
};
// clang-format on

}  // namespace rows

// The bodies. StdResource derives from this struct, so that they can be named as its own.
struct StdResourceMessages : Family<StdResourceMessages> {
    // The refused parameter of an error; it has this form for every parameter command.
    using Data_ErrorMsg_0x8_t = vela::Body<noCode, rows::NumVal>;
    using Data_ErrorMsg_0xa_t = Data_ErrorMsg_0x8_t;
    using Data_ErrorMsg_0x12_t = Data_ErrorMsg_0x8_t;
    using Data_ErrorMsg_0x14_t = Data_ErrorMsg_0x8_t;
    using Data_ErrorMsg_0x2d_t = Data_ErrorMsg_0x8_t;
    using Data_ErrorMsg_0x2f_t = Data_ErrorMsg_0x8_t;

    // clang-format off
    struct MsgError_t : Body<0, rows::Error> { using Body::Body; };  // the reply to a failed command
    struct MsgAck_t : Body<1> {};
    struct MsgComtestCmplt_t : Body<3> {};
    struct MsgComtest_t : Command<2, MsgComtestCmplt_t> {};
    struct MsgInitCmplt_t : Body<5> {};
    struct MsgInit_t : Command<4, MsgInitCmplt_t> {};
    struct MsgExitCmplt_t : Body<7> {};
    struct MsgExit_t : Command<6, MsgExitCmplt_t> {};
    struct MsgSetParmCmplt_t : Body<9> {};
    struct MsgSetParm_t : Command<8, MsgSetParmCmplt_t, rows::ParmVal> { using Command::Command; };
    struct MsgSetxParmsCmplt_t : Body<11> {};
    struct MsgSetxParms_t : Command<10, MsgSetxParmsCmplt_t, rows::ParmValList> { using Command::Command; };
    struct MsgSetParmDefCmplt_t : Body<13> {};
    struct MsgSetParmDef_t : Command<12, MsgSetParmDefCmplt_t, rows::ParmOnly> { using Command::Command; };
    struct MsgSetxParmsDefCmplt_t : Body<15> {};
    struct MsgSetxParmsDef_t : Command<14, MsgSetxParmsDefCmplt_t, rows::ParmList> { using Command::Command; };
    struct MsgSetAllParmsDefCmplt_t : Body<17> {};
    struct MsgSetAllParmsDef_t : Command<16, MsgSetAllParmsDefCmplt_t> {};
    struct MsgGetParmCmplt_t : Body<19, rows::GetParmCmplt> { using Body::Body; };
    struct MsgGetParm_t : Command<18, MsgGetParmCmplt_t, rows::NumOnly> { using Command::Command; };
    struct MsgGetxParmsCmplt_t : Body<21, rows::ParmValList> { using Body::Body; };
    struct MsgGetxParms_t : Command<20, MsgGetxParmsCmplt_t, rows::ParmValList> { using Command::Command; };
    struct MsgDetectEvtCmplt_t : Body<23> {};
    struct MsgDetectEvt_t : Command<22, MsgDetectEvtCmplt_t, rows::DetectEvt> { using Command::Command; };
    struct MsgDetectxEvtsCmplt_t : Body<25> {};
    struct MsgDetectxEvts_t : Command<24, MsgDetectxEvtsCmplt_t, rows::DetectxEvts> { using Command::Command; };
    struct MsgCancelEvtCmplt_t : Body<27> {};
    struct MsgCancelEvt_t : Command<26, MsgCancelEvtCmplt_t, rows::TypeOnly> { using Command::Command; };
    struct MsgCancelxEvtsCmplt_t : Body<29> {};
    struct MsgCancelxEvts_t : Command<28, MsgCancelxEvtsCmplt_t, rows::CancelxEvts> { using Command::Command; };
    struct MsgCancelAllEvts_t : Body<30> {};
    struct MsgEvtDetected_t : Body<32, rows::EvtDetected> { using Body::Body; };
    struct MsgArmRTCCmplt_t : Body<34> {};
    struct MsgArmRTC_t : Command<33, MsgArmRTCCmplt_t, rows::GroupAction> { using Command::Command; };
    struct MsgArmxRTCsCmplt_t : Body<36> {};
    struct MsgArmxRTCs_t : Command<35, MsgArmxRTCsCmplt_t, rows::ArmxRTCs> { using Command::Command; };
    struct MsgDisarmRTCCmplt_t : Body<38> {};
    struct MsgDisarmRTC_t : Command<37, MsgDisarmRTCCmplt_t, rows::GroupOnly> { using Command::Command; };
    struct MsgDisarmxRTCsCmplt_t : Body<40> {};
    struct MsgDisarmxRTCs_t : Command<39, MsgDisarmxRTCsCmplt_t, rows::DisarmxRTCs> { using Command::Command; };
    struct MsgDisarmAllRTCsCmplt_t : Body<42> {};
    struct MsgDisarmAllRTCs_t : Command<41, MsgDisarmAllRTCsCmplt_t> {};
    struct MsgGetVParmCmplt_t : Body<46, rows::ParmVarValList> { using Body::Body; };
    struct MsgGetVParm_t : Command<45, MsgGetVParmCmplt_t, rows::ParmList> { using Command::Command; };
    struct MsgSetVParmCmplt_t : Body<48> {};
    struct MsgSetVParm_t : Command<47, MsgSetVParmCmplt_t, rows::ParmValList> { using Command::Command; };
    // clang-format on

    using Bodies =
        BodyTable<MsgError_t, MsgAck_t, MsgComtest_t, MsgComtestCmplt_t, MsgInit_t, MsgInitCmplt_t, MsgExit_t,
                  MsgExitCmplt_t, MsgSetParm_t, MsgSetParmCmplt_t, MsgSetxParms_t, MsgSetxParmsCmplt_t,
                  MsgSetParmDef_t, MsgSetParmDefCmplt_t, MsgSetxParmsDef_t, MsgSetxParmsDefCmplt_t,
                  MsgSetAllParmsDef_t, MsgSetAllParmsDefCmplt_t, MsgGetParm_t, MsgGetParmCmplt_t,
                  MsgGetxParms_t, MsgGetxParmsCmplt_t, MsgDetectEvt_t, MsgDetectEvtCmplt_t, MsgDetectxEvts_t,
                  MsgDetectxEvtsCmplt_t, MsgCancelEvt_t, MsgCancelEvtCmplt_t, MsgCancelxEvts_t,
                  MsgCancelxEvtsCmplt_t, MsgCancelAllEvts_t, MsgEvtDetected_t, MsgArmRTC_t, MsgArmRTCCmplt_t,
                  MsgArmxRTCs_t, MsgArmxRTCsCmplt_t, MsgDisarmRTC_t, MsgDisarmRTCCmplt_t, MsgDisarmxRTCs_t,
                  MsgDisarmxRTCsCmplt_t, MsgDisarmAllRTCs_t, MsgDisarmAllRTCsCmplt_t, MsgGetVParm_t,
                  MsgGetVParmCmplt_t, MsgSetVParm_t, MsgSetVParmCmplt_t>;
};

}  // namespace vela

#endif

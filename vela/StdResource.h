// The host's proxy of a component instance: the commands that every one of them understands.
#ifndef VELA_STDRESOURCE_H
#define VELA_STDRESOURCE_H

#include "vela/Addressable.h"
#include "vela/StdResourceMessages.h"

namespace vela {

class StdResource : public Addressable {
  public:
    // What the refused parameter of an error was; the same for every parameter command.
    using Data_ErrorMsg_0x8_t = Body<NoCode, rows::NumVal>;
    using Data_ErrorMsg_0xa_t = Data_ErrorMsg_0x8_t;
    using Data_ErrorMsg_0x12_t = Data_ErrorMsg_0x8_t;
    using Data_ErrorMsg_0x14_t = Data_ErrorMsg_0x8_t;
    using Data_ErrorMsg_0x2d_t = Data_ErrorMsg_0x8_t;
    using Data_ErrorMsg_0x2f_t = Data_ErrorMsg_0x8_t;

    // The reply to a failed command. Data is there for the parameter commands alone.
    class MsgError_t : public Body<0, rows::ErrorHead> {
      public:
        Nested<Data_ErrorMsg_0x8_t, "Data"> Data;

        MsgError_t() = default;
        MsgError_t(unsigned int& errorMsg, unsigned int& errorCode, Data_ErrorMsg_0x8_t& data);

        bool hasData() const;
        unsigned int writeMsg(Msg* msg, unsigned int offset) override;
        unsigned int readMsg(Msg* msg, unsigned int offset) override;
        unsigned int GetByteSize() const override;
        void toStream(std::ostream* out) const override;  // "NULL" in place of data that is not there
    };

    using MsgAck_t = Body<1, NoFields>;
    using MsgComtest_t = Body<2, NoFields>;
    using MsgComtestCmplt_t = Body<3, NoFields>;
    using MsgInit_t = Body<4, NoFields>;
    using MsgInitCmplt_t = Body<5, NoFields>;
    using MsgExit_t = Body<6, NoFields>;
    using MsgExitCmplt_t = Body<7, NoFields>;
    using MsgSetParm_t = Body<8, rows::ParmVal>;
    using MsgSetParmCmplt_t = Body<9, NoFields>;
    using MsgSetxParms_t = Body<10, rows::ParmValList>;
    using MsgSetxParmsCmplt_t = Body<11, NoFields>;
    using MsgSetParmDef_t = Body<12, rows::ParmOnly>;
    using MsgSetParmDefCmplt_t = Body<13, NoFields>;
    using MsgSetxParmsDef_t = Body<14, rows::ParmList>;
    using MsgSetxParmsDefCmplt_t = Body<15, NoFields>;
    using MsgSetAllParmsDef_t = Body<16, NoFields>;
    using MsgSetAllParmsDefCmplt_t = Body<17, NoFields>;
    using MsgGetParm_t = Body<18, rows::NumOnly>;
    using MsgGetParmCmplt_t = Body<19, rows::GetParmCmplt>;
    using MsgGetxParms_t = Body<20, rows::ParmValList>;
    using MsgGetxParmsCmplt_t = Body<21, rows::ParmValList>;
    using MsgDetectEvt_t = Body<22, rows::DetectEvt>;
    using MsgDetectEvtCmplt_t = Body<23, NoFields>;
    using MsgDetectxEvts_t = Body<24, rows::DetectxEvts>;
    using MsgDetectxEvtsCmplt_t = Body<25, NoFields>;
    using MsgCancelEvt_t = Body<26, rows::TypeOnly>;
    using MsgCancelEvtCmplt_t = Body<27, NoFields>;
    using MsgCancelxEvts_t = Body<28, rows::CancelxEvts>;
    using MsgCancelxEvtsCmplt_t = Body<29, NoFields>;
    using MsgCancelAllEvts_t = Body<30, NoFields>;
    using MsgEvtDetected_t = Body<32, rows::EvtDetected>;
    using MsgArmRTC_t = Body<33, rows::GroupAction>;
    using MsgArmRTCCmplt_t = Body<34, NoFields>;
    using MsgArmxRTCs_t = Body<35, rows::ArmxRTCs>;
    using MsgArmxRTCsCmplt_t = Body<36, NoFields>;
    using MsgDisarmRTC_t = Body<37, rows::GroupOnly>;
    using MsgDisarmRTCCmplt_t = Body<38, NoFields>;
    using MsgDisarmxRTCs_t = Body<39, rows::DisarmxRTCs>;
    using MsgDisarmxRTCsCmplt_t = Body<40, NoFields>;
    using MsgDisarmAllRTCs_t = Body<41, NoFields>;
    using MsgDisarmAllRTCsCmplt_t = Body<42, NoFields>;
    using MsgGetVParm_t = Body<45, rows::ParmList>;
    using MsgGetVParmCmplt_t = Body<46, rows::ParmVarValList>;
    using MsgSetVParm_t = Body<47, rows::ParmValList>;
    using MsgSetVParmCmplt_t = Body<48, NoFields>;

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

    StdResource(const CompDesc_t& target, MsgQueue* queue) : Addressable(target, queue) {}
    explicit StdResource(const Addressable& other) : Addressable(other) {}
    StdResource(const StdResource& other) = default;
    ~StdResource() override { endCallbacks(); }

    MsgBody* MsgBodyLookup(unsigned int msgType) override;

    // Marks the component as in use, with a word of the user's own, or as no longer in use, or gives an
    // allocated instance back: requests to the board's resource manager. Throw Timeout, UnexpectedMsg.
    void use(unsigned int payload);
    void unuse();
    void free();

    // Commands: each waits for its completion and reads it into reply unless that is null. Throw Timeout,
    // UnexpectedMsg (the board's refusal among them).
    void SetParm(unsigned int parm, unsigned int value, MsgSetParmCmplt_t* reply);
    virtual void GetParm(unsigned int parm, MsgGetParmCmplt_t* reply);
    // Events of the type go to returnTo's address, or with null to this object's own queue.
    virtual void DetectEvt(unsigned int evtType, unsigned int evtGroup, Addressable* returnTo);
    virtual void CancelEvt(unsigned int evtType, Addressable* returnTo);

  protected:
    // A command and the reply that its type names.
    template <typename Reply, typename Command>
    void command(Command&& cmd, Reply* reply) {
        request(std::remove_reference_t<Command>::code, &cmd, Reply::code, reply);
    }
};

}  // namespace vela

#endif

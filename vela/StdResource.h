// A component instance of any kind, with the commands that all of them understand.
#ifndef VELA_STDRESOURCE_H
#define VELA_STDRESOURCE_H

#include <algorithm>

#include "vela/Addressable.h"
#include "vela/StdResourceMessages.h"
#include "vela/WithBodies.h"

namespace vela {

class StdResource : public WithBodies<Addressable, StdResourceMessages> {
  public:
    StdResource(const CompDesc_t& target, MsgQueue* queue) : WithBodies(target, queue) {}
    // If inUse is not 0, marks the component as in use. Throws Timeout, UnexpectedMsg.
    StdResource(const CompDesc_t& target, MsgQueue* queue, int inUse);
    explicit StdResource(const Addressable& other) : WithBodies(other) {}
    StdResource(const StdResource& other) = default;
    // An object that `finder` has found at the address. It uses the queue and the time-outs of `finder`.
    StdResource(const CompDesc_t& target, const Addressable& finder) : WithBodies(target, finder) {}
    ~StdResource() override { endCallbacks(); }

    // NOLINTNEXTLINE(bugprone-virtual-near-miss): programs call both names
    void msgQueueAttach(MsgQueue* queue) { MsgQueueAttach(queue); }
    // Requests to the board's resource manager: mark the component as in use, with a number of the caller's
    // choice; mark it as no longer in use; give an allocated instance back. Throw Timeout, UnexpectedMsg.
    // They are virtual, so that an Instance remembers what was done through a reference to this base class.
    virtual void use(unsigned int payload);
    virtual void unuse();
    virtual void free();

    // Commands. Each has a form that takes a prepared body and one that takes the fields. It waits for the
    // reply and reads it into `reply`, unless that is null. Without a `wait` it waits for the object's
    // response time-out. A command that has no reply waits for an error only. All throw Timeout, and
    // UnexpectedMsg, also when the component refuses.
    void Init(MsgInit_t& cmd, MsgInitCmplt_t* reply, Wait wait = {}) { command(cmd, reply, wait); }
    void Init(MsgInitCmplt_t* reply, Wait wait = {}) { command(MsgInit_t(), reply, wait); }
    void Exit(MsgExit_t& cmd, MsgExitCmplt_t* reply, Wait wait = {}) { command(cmd, reply, wait); }
    void Exit(MsgExitCmplt_t* reply, Wait wait = {}) { command(MsgExit_t(), reply, wait); }
    void ComTest(MsgComtest_t& cmd, MsgComtestCmplt_t* reply, Wait wait = {}) { command(cmd, reply, wait); }
    void ComTest(MsgComtestCmplt_t* reply, Wait wait = {}) { command(MsgComtest_t(), reply, wait); }
    void Ack(MsgAck_t& cmd, Wait wait = {}) { command(cmd, wait); }
    void Ack(Wait wait = {}) { command(MsgAck_t(), wait); }
    void Error(MsgError_t& cmd, Wait wait = {}) { command(cmd, wait); }
    void Error(unsigned int errorMsg, unsigned int errorCode, Data_ErrorMsg_0x8_t data = {}, Wait wait = {}) {
        command(MsgError_t(errorMsg, errorCode, data), wait);
    }

    void SetParm(MsgSetParm_t& cmd, MsgSetParmCmplt_t* reply, Wait wait = {}) { command(cmd, reply, wait); }
    void SetParm(unsigned int parm, unsigned int value, MsgSetParmCmplt_t* reply, Wait wait = {}) {
        command(MsgSetParm_t(parm, value), reply, wait);
    }
    void GetParm(MsgGetParm_t& cmd, MsgGetParmCmplt_t* reply, Wait wait = {}) { command(cmd, reply, wait); }
    virtual void GetParm(unsigned int parm, MsgGetParmCmplt_t* reply, Wait wait = {}) {
        command(MsgGetParm_t(parm), reply, wait);
    }
    void SetxParms(MsgSetxParms_t& cmd, MsgSetxParmsCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void SetxParms(staticList<MsgSetxParms_t::Parms_t>& parms, MsgSetxParmsCmplt_t* reply, Wait wait = {}) {
        command(MsgSetxParms_t(parms), reply, wait);
    }
    void GetxParms(MsgGetxParms_t& cmd, MsgGetxParmsCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void GetxParms(staticList<MsgGetxParms_t::Parms_t>& parms, MsgGetxParmsCmplt_t* reply, Wait wait = {}) {
        command(MsgGetxParms_t(parms), reply, wait);
    }
    // The forms with fields send the first `count` parameters of the list, or all if there are fewer.
    void SetVParm(MsgSetVParm_t& cmd, MsgSetVParmCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void SetVParm(unsigned short count, staticList<MsgSetVParm_t::Parms_t> parms, MsgSetVParmCmplt_t* reply,
                  Wait wait = {}) {
        command(MsgSetVParm_t(firstOf(count, parms)), reply, wait);
    }
    void GetVParm(MsgGetVParm_t& cmd, MsgGetVParmCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void GetVParm(unsigned short count, staticList<MsgGetVParm_t::Parms_t> parms, MsgGetVParmCmplt_t* reply,
                  Wait wait = {}) {
        command(MsgGetVParm_t(firstOf(count, parms)), reply, wait);
    }
    void SetParmDef(MsgSetParmDef_t& cmd, MsgSetParmDefCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void SetParmDef(unsigned int parm, MsgSetParmDefCmplt_t* reply, Wait wait = {}) {
        command(MsgSetParmDef_t(parm), reply, wait);
    }
    void SetxParmsDef(MsgSetxParmsDef_t& cmd, MsgSetxParmsDefCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void SetxParmsDef(staticList<MsgSetxParmsDef_t::Parms_t>& parms, MsgSetxParmsDefCmplt_t* reply,
                      Wait wait = {}) {
        command(MsgSetxParmsDef_t(parms), reply, wait);
    }
    void SetAllParmsDef(MsgSetAllParmsDef_t& cmd, MsgSetAllParmsDefCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void SetAllParmsDef(MsgSetAllParmsDefCmplt_t* reply, Wait wait = {}) {
        command(MsgSetAllParmsDef_t(), reply, wait);
    }

    // Makes the component send its events of this type. If returnTo is null, the events go to the host
    // address of this object's queue, where the object's callbacks get them; if the object later moves to
    // another queue, they still go to the old one. If returnTo is an object, the events go to that object's
    // target address on its board, and not to its callbacks. Cancelling names only the type.
    void DetectEvt(MsgDetectEvt_t& cmd, MsgDetectEvtCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    virtual void DetectEvt(unsigned int evtType, unsigned int evtGroup, Addressable* returnTo,
                           Wait wait = {});
    void DetectxEvts(MsgDetectxEvts_t& cmd, MsgDetectxEvtsCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void DetectxEvts(staticList<MsgDetectxEvts_t::List_t>& events, Addressable* returnTo, Wait wait = {});
    void CancelEvt(MsgCancelEvt_t& cmd, MsgCancelEvtCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    virtual void CancelEvt(unsigned int evtType, Addressable* /*returnTo*/, Wait wait = {}) {
        command(MsgCancelEvt_t(evtType), nullptr, wait);
    }
    void CancelxEvts(MsgCancelxEvts_t& cmd, MsgCancelxEvtsCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void CancelxEvts(staticList<unsigned int>& evtTypes, Addressable* /*returnTo*/, Wait wait = {}) {
        command(MsgCancelxEvts_t(evtTypes), nullptr, wait);
    }
    void CancelAllEvts(MsgCancelAllEvts_t& cmd, Wait wait = {}) { command(cmd, wait); }
    void CancelAllEvts(Addressable* /*returnTo*/, Wait wait = {}) { command(MsgCancelAllEvts_t(), wait); }

    // Commands for run-time controls.
    void ArmRTC(MsgArmRTC_t& cmd, MsgArmRTCCmplt_t* reply, Wait wait = {}) { command(cmd, reply, wait); }
    void ArmRTC(unsigned int evtGroup, unsigned int action, MsgArmRTCCmplt_t* reply, Wait wait = {}) {
        command(MsgArmRTC_t(evtGroup, action), reply, wait);
    }
    void ArmxRTCs(MsgArmxRTCs_t& cmd, MsgArmxRTCsCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void ArmxRTCs(staticList<MsgArmxRTCs_t::EventGroupList_t>& groups, MsgArmxRTCsCmplt_t* reply,
                  Wait wait = {}) {
        command(MsgArmxRTCs_t(groups), reply, wait);
    }
    void DisArmRTC(MsgDisarmRTC_t& cmd, MsgDisarmRTCCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void DisArmRTC(unsigned int evtGroup, MsgDisarmRTCCmplt_t* reply, Wait wait = {}) {
        command(MsgDisarmRTC_t(evtGroup), reply, wait);
    }
    void DisarmxRTCs(MsgDisarmxRTCs_t& cmd, MsgDisarmxRTCsCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void DisarmxRTCs(staticList<unsigned int>& groups, MsgDisarmxRTCsCmplt_t* reply, Wait wait = {}) {
        command(MsgDisarmxRTCs_t(groups), reply, wait);
    }
    void DisarmAllRTCs(MsgDisarmAllRTCs_t& cmd, MsgDisarmAllRTCsCmplt_t* reply, Wait wait = {}) {
        command(cmd, reply, wait);
    }
    void DisarmAllRTCs(MsgDisarmAllRTCsCmplt_t* reply, Wait wait = {}) {
        command(MsgDisarmAllRTCs_t(), reply, wait);
    }

  private:
    CompDesc_t returnAddress(const Addressable* returnTo) const;

    template <typename T>
    static staticList<T>& firstOf(unsigned int count, staticList<T>& elements) {
        elements.realloc(std::min(count, elements.length()));
        return elements;
    }
};

}  // namespace vela

#endif

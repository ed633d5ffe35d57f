// The messages that every component instance understands, as rows of fields; their codes and names are in
// StdResource.h. Widths: 32-bit unsigned unless the field says otherwise; addresses are CompDesc_t.
#ifndef VELA_STDRESOURCEMESSAGES_H
#define VELA_STDRESOURCEMESSAGES_H

#include "vela/Body.h"
#include "vela/CompDesc.h"

namespace vela::rows {

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

struct ErrorHead { U32<"ErrorMsg"> ErrorMsg; U32<"ErrorCode"> ErrorCode; };

struct ParmValList {
    using Parms_t = Body<NoCode, ParmVal>;
    Count32<"Count"> Count; ListOf<Parms_t, "Parms"> Parms;
};
struct ParmVarValList {
    using Parms_t = Body<NoCode, ParmVarVal>;
    Count32<"Count"> Count; ListOf<Parms_t, "Parms"> Parms;
};
struct ParmList {
    using Parms_t = Body<NoCode, ParmOnly>;
    Count32<"Count"> Count; ListOf<Parms_t, "Parms"> Parms;
};

struct GetParmCmplt {
    U32<"Num"> Num; U32<"Val"> Val; Count32<"TextSize"> TextSize;
    Rest<unsigned char, WireType::Text8, "Text"> Text;
};

struct DetectEvt { Nested<CompDesc_t, "RetAddr"> RetAddr; U32<"EvtType"> EvtType; U32<"EvtGroup"> EvtGroup; };
struct DetectxEvts {
    using List_t = Body<NoCode, TypeGroup>;
    Nested<CompDesc_t, "RetAddr"> RetAddr; Count32<"Count"> Count; ListOf<List_t, "List"> List;
};
struct CancelxEvts { Count32<"Count"> Count; Array<unsigned int, WireType::Unsigned32, "EvtTypeList"> EvtTypeList; };
struct EvtDetected { U32<"EvtGroup"> EvtGroup; RestBytes<"Data"> Data; };

struct ArmxRTCs {
    using EventGroupList_t = Body<NoCode, GroupAction>;
    Count32<"Count"> Count; ListOf<EventGroupList_t, "EventGroupList"> EventGroupList;
};
struct DisarmxRTCs {
    Count32<"Count"> Count; Array<unsigned int, WireType::Unsigned32, "EventGroupList"> EventGroupList;
};
// clang-format on

}  // namespace vela::rows

#endif

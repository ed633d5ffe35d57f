#include "vela/CCS.h"

namespace vela {

MsgBody* CCS::EvtBodyLookup(unsigned int evtType) {
    MsgBody* const body = BodyTable<EvtL2Trace_t>::make(evtType);
    return body != nullptr ? body : Component::EvtBodyLookup(evtType);
}

}  // namespace vela

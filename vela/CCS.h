// The common-channel-signalling component: runs the D channel and reports its layer-2 frames.
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
// clang-format on
}  // namespace rows

class CCS : public Component {
  public:
    static constexpr unsigned int L2TraceGroup = 2;

    // One layer-2 trace record. Label 2 is a frame; Direction 1 was transmitted by the board, anything else
    // received; Timestamp in ticks of 4 ms; Length in octets, of which List may hold fewer.
    using EvtL2Trace_t = Body<L2TraceGroup, rows::EvtL2Trace>;

    CCS(const CompDesc_t& target, MsgQueue* queue) : Component(target, queue) {}
    ~CCS() override { endCallbacks(); }

    MsgBody* EvtBodyLookup(unsigned int evtType) override;

    void* userData = nullptr;  // the owner's own
};

}  // namespace vela

#endif

// The message that carries every event.
#ifndef VELA_EVTGROUPOF_H
#define VELA_EVTGROUPOF_H

#include "vela/Body.h"

namespace vela {

inline constexpr unsigned int evtDetected = 32;  // the standard resource's event-detected message

// The group is the first field of every event; 0 when the payload is too short to hold one.
inline unsigned int evtGroupOf(Msg& msg) {
    struct Row {
        U32<"EvtGroup"> EvtGroup;
    };
    Body<noCode, Row> head;
    msg.read(&head, 0);
    return head.EvtGroup;
}

}  // namespace vela

#endif

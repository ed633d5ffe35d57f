// The rows of fields of the messages of a board's managers and of its clusters. Codes and names are in the
// headers of the families. Numbers are 32 bits unsigned unless the field says otherwise; addresses are
// CompDesc_t.
#ifndef VELA_MANAGERMESSAGES_H
#define VELA_MANAGERMESSAGES_H

#include "vela/Body.h"
#include "vela/CompAttr.h"
#include "vela/CompDesc.h"

namespace vela {

namespace rows {

template <Label name>
using Address = Nested<CompDesc_t, name>;
template <Label name>
using Attributes = ListOf<CompAttr_t, name>;

// clang-format off
struct DescOnly { Address<"desc"> desc; };
struct ClustDescOnly { Address<"ClustDesc"> ClustDesc; };

struct CompStartAttr { Address<"CompStart"> CompStart; Count32<"count"> count; Attributes<"attr"> attr; };

struct CompAttrInfo { Address<"theInstance"> theInstance; U32<"count"> count; U32<"attroffset"> attroffset; };
struct CompAttrInfoResult {
    Address<"theComponent"> theComponent; Count32<"count"> count; Attributes<"attrs"> attrs;
};
struct CompInstAllocate {
    Address<"CompStart"> CompStart; Address<"ClustDesc"> ClustDesc;
    Count32<"count"> count; Attributes<"attr"> attr;
};
struct DescPayload { Address<"desc"> desc; U32<"Payload"> Payload; };
struct CompUse {
    using List_t = Body<noCode, DescPayload>;
    Count32<"Count"> Count; ListOf<List_t, "List"> List;
};
struct CompUnuse {
    using List_t = Body<noCode, DescOnly>;
    Count32<"Count"> Count; ListOf<List_t, "List"> List;
};
struct CompFindAll {
    Address<"startDesc"> startDesc; Address<"endDesc"> endDesc;
    Count32<"count"> count; Attributes<"attr"> attr;
};
struct CompAttrs { Address<"compDesc"> compDesc; Nested<CompAttr_t, "attrs"> attrs; };
struct CompMultipleResult {
    using comps_t = Body<noCode, CompAttrs>;
    Count32<"count"> count; Address<"nextComponent"> nextComponent; ListOf<comps_t, "comps"> comps;
};

struct ClusterCompByAttr {
    Address<"ClustDesc"> ClustDesc; U32<"CompType"> CompType; Count32<"Count"> Count; Attributes<"Attrs"> Attrs;
};
struct AttrsOnly { Count32<"Count"> Count; Attributes<"Attrs"> Attrs; };
struct ClusterActivate {
    Address<"ClustDesc"> ClustDesc; U32<"portId"> portId; U32<"options"> options;
    Address<"talkerDesc"> talkerDesc;
};
struct ClusterConnect {
    Address<"InstDesc1"> InstDesc1; U32<"portId1"> portId1;
    Address<"InstDesc2"> InstDesc2; U32<"portId2"> portId2;
};
struct ClusterPort { Address<"ClustDesc"> ClustDesc; U32<"portId"> portId; };
struct ClusterSlotInfo { Address<"ClustDesc"> ClustDesc; Value32<"portId"> portId; };
struct ClusterCompInfoResult {
    Address<"ClustDesc"> ClustDesc; Count32<"count"> count; ListOf<CompDesc_t, "instances"> instances;
};
struct ClusterSlots {
    Address<"ClustDesc"> ClustDesc; U32<"portId"> portId; Count32<"width"> width; U32<"encoding"> encoding;
    U32<"idlePattern"> idlePattern; Array<unsigned int, WireType::unsigned32, "slotIds"> slotIds;
};
struct ClusterUnlockCmplt {
    U32<"unlocked"> unlocked; Count32<"count"> count; ListOf<CompDesc_t, "unlockedList"> unlockedList;
};
// clang-format on

}  // namespace rows

// The bodies that several families share.
struct ManagerMessages {
    // clang-format off
    struct ResultComplete_t : Body<8388608> {};
    struct ComponentResult_t : Body<8388615, rows::DescOnly> { using Body::Body; };
    struct ClusterResult_t : Body<8388652, rows::DescOnly> { using Body::Body; };
    // clang-format on
};

}  // namespace vela

#endif

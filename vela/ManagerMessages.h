// The messages of a board's managers and clusters, as rows of fields; their codes and names are with their
// families. Widths: 32-bit unsigned unless the field says otherwise; addresses are CompDesc_t.
#ifndef VELA_MANAGERMESSAGES_H
#define VELA_MANAGERMESSAGES_H

#include "vela/Body.h"
#include "vela/CompAttr.h"
#include "vela/CompDesc.h"

namespace vela::rows {

template <Label name>
using Address = Nested<CompDesc_t, name>;
template <Label name>
using Attributes = ListOf<CompAttr_t, name>;

// clang-format off
struct DescOnly { Address<"desc"> desc; };

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
    using List_t = Body<NoCode, DescPayload>;
    Count32<"Count"> Count; ListOf<List_t, "List"> List;
};
struct CompUnuse {
    using List_t = Body<NoCode, DescOnly>;
    Count32<"Count"> Count; ListOf<List_t, "List"> List;
};

struct CompFindAll {
    Address<"startDesc"> startDesc; Address<"endDesc"> endDesc;
    Count32<"count"> count; Attributes<"attr"> attr;
};
struct CompAttrs {
    Address<"compDesc"> compDesc; Nested<CompAttr_t, "attrs"> attrs;
};
struct CompMultipleResult {
    using comps_t = Body<NoCode, CompAttrs>;
    Count32<"count"> count; Address<"nextComponent"> nextComponent; ListOf<comps_t, "comps"> comps;
};
// clang-format on

}  // namespace vela::rows

#endif

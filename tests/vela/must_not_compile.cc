// Each case but 0 is a mistake that the compiler finds.
#include "vela/CCS.h"

using namespace vela;  // NOLINT

#if CASE == 0
struct Other : Body<9> {};
using Family = BodyTable<StdResource::MsgSetParm_t, Other>;
void right(StdResource::MsgSetParm_t& body) { body.Val = 1; }
#elif CASE == 1
struct Other : Body<8> {};
using Family = BodyTable<StdResource::MsgSetParm_t, Other>;
unsigned int size = Family::size;
#elif CASE == 2
void misspelt(StdResource::MsgSetParm_t& body) { body.Vall = 1; }
#elif CASE == 3
struct Row {
    Count32<"Count"> Count;
    U32<"Val"> Val;
};
Body<1001, Row> countWithoutList;
#elif CASE == 4
unsigned int parm;
unsigned short tooNarrow;
StdResource::MsgSetParm_t bound(parm, tooNarrow);
#elif CASE == 5
void wrongReply(StdResource& resource, StdResource::MsgGetParmCmplt_t& reply) {
    resource.SetParm(10, 1, &reply);
}
#elif CASE == 6
struct Listener : AsyncMsgReceiver {
    using AsyncMsgReceiver::AsyncMsgReceiver;
    void receive(Msg*) override {}
};
Listener neverRegistered(nullptr);
#endif

// Each case but 0 is a mistake that the compiler finds.
#include "vela/CCS.h"

using namespace vela;  // NOLINT

#if CASE == 0
struct Messages : Family<Messages> {
    struct Listed_t : Body<1001> {};
    struct Event_t : Body<1002> {};
    using Bodies = BodyTable<Listed_t>;
    using Events = BodyTable<Event_t>;
};
Messages::Listed_t listed;
Messages::Event_t event;
struct Other : Body<9> {};
using Table = BodyTable<StdResource::MsgSetParm_t, Other>;
void right(StdResource::MsgSetParm_t& body) { body.Val = 1; }
#elif CASE == 1
struct Other : Body<8> {};
using Table = BodyTable<StdResource::MsgSetParm_t, Other>;
unsigned int size = Table::size;
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
#elif CASE == 7
struct Messages : Family<Messages> {
    struct Listed_t : Body<1001> {};
    struct Forgotten_t : Body<1002> {};
    using Bodies = BodyTable<Listed_t>;
};
Messages::Forgotten_t forgotten;
#elif CASE == 8
struct Messages : Family<Messages> {
    struct Answer_t : Body<1001> {};
    struct Forgotten_t : Command<1002, Answer_t, rows::ParmOnly> {
        using Command::Command;
    };
    using Bodies = BodyTable<Answer_t>;
    using Events = BodyTable<Answer_t>;
};
unsigned int parm;
Messages::Forgotten_t forgotten(parm);
#endif

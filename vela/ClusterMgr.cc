#include "vela/ClusterMgr.h"

namespace vela {

MsgBody* ClusterMgr::MsgBodyLookup(unsigned int msgType) {
    MsgBody* const body = Bodies::make(msgType);
    return body != nullptr ? body : superMsgBodyLookup(msgType);
}

}  // namespace vela

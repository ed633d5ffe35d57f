// The entry point for one board.
#ifndef VELA_BOARD_H
#define VELA_BOARD_H

#include <memory>

#include "vela/Addressable.h"
#include "vela/ClusterMgr.h"
#include "vela/Component.h"
#include "vela/ResourceMgr.h"

namespace vela {

class Board : public Addressable {
  public:
    // A null queue gives the board a private one, which what is found through it shares.
    Board(unsigned int board, MsgQueue* queue);
    ~Board() override { endCallbacks(); }

    // Makes the managers again on the new queue.
    void MsgQueueAttach(MsgQueue* queue) override;
    // The cluster manager's bodies, then the resource manager's.
    MsgBody* MsgBodyLookup(unsigned int msgType) override;
    MsgBody* EvtBodyLookup(unsigned int evtType) override;

    // The first component of the type (0: any) on the processor, or the instance of that number. Throw
    // Timeout when the board is silent, UnexpectedMsg when it refuses.
    Component findComp(unsigned char compType, unsigned char processor);
    Instance findInst(unsigned char compType, unsigned char processor, unsigned short instance);

    // The managers' time-outs too, and with them those of what is found from now on.
    void setResponseTimeout(unsigned int ms) override;
    void setErrorWaitTime(unsigned int ms) override;

    // The board's own. A time-out that is set on a manager is that manager's alone.
    ResourceMgr& resourceMgr() { return *resourceMgr_; }
    ClusterMgr& clusterMgr() { return *clusterMgr_; }

  private:
    void makeManagers();

    std::unique_ptr<ResourceMgr> resourceMgr_;
    std::unique_ptr<ClusterMgr> clusterMgr_;
};

}  // namespace vela

#endif

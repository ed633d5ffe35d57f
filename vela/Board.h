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
    // If the queue is null, the board makes a private one. Objects that are found through the board share its
    // queue.
    Board(unsigned int board, MsgQueue* queue);
    ~Board() override { endCallbacks(); }

    // Moves the board to another queue and makes its managers anew on that queue.
    void MsgQueueAttach(MsgQueue* queue) override;
    // Looks among the bodies of the cluster manager, then among those of the resource manager.
    MsgBody* MsgBodyLookup(unsigned int msgType) override;
    MsgBody* EvtBodyLookup(unsigned int evtType) override;

    // Find the first component of the type (0: any) on the processor, or the instance with that number. Throw
    // Timeout when the board does not answer, and UnexpectedMsg when it refuses, also because nothing was
    // found.
    Component findComp(unsigned char compType, unsigned char processor);
    Instance findInst(unsigned char compType, unsigned char processor, unsigned short instance);

    // Also sets the time-out of the managers, and so of the objects that are found from now on.
    void setResponseTimeout(unsigned int ms) override;
    void setErrorWaitTime(unsigned int ms) override;

    // The board owns the managers. A time-out that is set on a manager is for that manager only.
    ResourceMgr& resourceMgr() { return *resourceMgr_; }
    ClusterMgr& clusterMgr() { return *clusterMgr_; }

  private:
    void makeManagers();

    std::unique_ptr<ResourceMgr> resourceMgr_;
    std::unique_ptr<ClusterMgr> clusterMgr_;
};

}  // namespace vela

#endif

// A cluster: component instances that share a time-division bus, their connections, ports and slots.
#ifndef VELA_CLUSTER_H
#define VELA_CLUSTER_H

#include "vela/Addressable.h"
#include "vela/ManagerMessages.h"
#include "vela/WithBodies.h"

namespace vela {

struct ClusterMessages : Family<ClusterMessages>, ManagerMessages {
    // clang-format off
    struct ClusterActivate_t : Command<8388635, ResultComplete_t, rows::ClusterActivate> { using Command::Command; };
    struct ClusterConnect_t : Command<8388639, ResultComplete_t, rows::ClusterConnect> { using Command::Command; };
    struct ClusterDeactivate_t : Command<8388643, ResultComplete_t, rows::ClusterPort> { using Command::Command; };
    struct ClusterDisconnect_t : Command<8388645, ResultComplete_t, rows::ClusterConnect> { using Command::Command; };
    struct ClusterCompInfoResult_t : Body<8388648, rows::ClusterCompInfoResult> { using Body::Body; };
    struct ClusterCompInfo_t : Command<8388647, ClusterCompInfoResult_t, rows::ClustDescOnly> { using Command::Command; };
    struct ClusterSlotAssign_t : Command<8388656, ResultComplete_t, rows::ClusterSlots> { using Command::Command; };
    struct ClusterSlotInfoResult_t : Body<8388659, rows::ClusterSlots> { using Body::Body; };
    struct ClusterSlotInfo_t : Command<8388658, ClusterSlotInfoResult_t, rows::ClusterSlotInfo> { using Command::Command; };
    struct ClusterSlotUnassign_t : Command<8388662, ResultComplete_t, rows::ClusterPort> { using Command::Command; };
    struct ClusterAttrAdd_t : Command<8388692, ResultComplete_t, rows::AttrsOnly> { using Command::Command; };
    struct ClusterAttrRemove_t : Command<8388693, ResultComplete_t, rows::AttrsOnly> { using Command::Command; };
    struct ClusterLock_t : Command<8388694, ResultComplete_t, rows::ClustDescOnly> { using Command::Command; };
    struct ClusterUnlockCmplt_t : Body<8388696, rows::ClusterUnlockCmplt> { using Body::Body; };
    struct ClusterUnlock_t : Command<8388695, ClusterUnlockCmplt_t, rows::ClustDescOnly> { using Command::Command; };
    // clang-format on

    using Bodies =
        BodyTable<ResultComplete_t, ClusterActivate_t, ClusterConnect_t, ClusterDeactivate_t,
                  ClusterDisconnect_t, ClusterCompInfo_t, ClusterCompInfoResult_t, ClusterSlotAssign_t,
                  ClusterSlotInfo_t, ClusterSlotInfoResult_t, ClusterSlotUnassign_t, ClusterAttrAdd_t,
                  ClusterAttrRemove_t, ClusterLock_t, ClusterUnlock_t, ClusterUnlockCmplt_t>;
};

class Cluster : public WithBodies<Addressable, ClusterMessages> {
  public:
    Cluster(const CompDesc_t& target, MsgQueue* queue) : WithBodies(target, queue) {}
    explicit Cluster(const Addressable& found) : WithBodies(found) {}
    Cluster(const Cluster& other) = default;
    // An object that `finder` has found at the address. It uses the queue and the time-outs of `finder`.
    Cluster(const CompDesc_t& target, const Addressable& finder) : WithBodies(target, finder) {}
    ~Cluster() override { endCallbacks(); }

    // Commands, each with its fields; WithBodies::send sends a prepared one. They name this cluster. All
    // throw Timeout, UnexpectedMsg. StdResource.h describes what they have in common.

    // Connects two members, each by one of its ports.
    void connect(CompDesc_t first, unsigned int firstPort, CompDesc_t second, unsigned int secondPort,
                 Wait wait = {}) {
        command(ClusterConnect_t(first, firstPort, second, secondPort), nullptr, wait);
    }
    void disconnect(CompDesc_t first, unsigned int firstPort, CompDesc_t second, unsigned int secondPort,
                    Wait wait = {}) {
        command(ClusterDisconnect_t(first, firstPort, second, secondPort), nullptr, wait);
    }

    void activate(unsigned int portId, unsigned int options, CompDesc_t talker, Wait wait = {});
    void deactivate(unsigned int portId, Wait wait = {});

    void assignSlots(unsigned int portId, unsigned int encoding, unsigned int idlePattern,
                     staticList<unsigned int>& slotIds, Wait wait = {});
    void unassignSlots(unsigned int portId, Wait wait = {});
    void slots(unsigned int portId, ClusterSlotInfoResult_t* reply, Wait wait = {});

    // Reads the members of the cluster.
    staticList<CompDesc_t> components(Wait wait = {});

    void addAttributes(staticList<CompAttr_t>& attributes, Wait wait = {}) {
        command(ClusterAttrAdd_t(attributes), nullptr, wait);
    }
    void removeAttributes(staticList<CompAttr_t>& attributes, Wait wait = {}) {
        command(ClusterAttrRemove_t(attributes), nullptr, wait);
    }

    void lock(Wait wait = {});
    void unlock(ClusterUnlockCmplt_t* reply, Wait wait = {});
};

}  // namespace vela

#endif

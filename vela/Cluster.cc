#include "vela/Cluster.h"

namespace vela {

void Cluster::activate(unsigned int portId, unsigned int options, CompDesc_t talker, Wait wait) {
    CompDesc_t own = getTgtDesc();
    command(ClusterActivate_t(own, portId, options, talker), nullptr, wait);
}

void Cluster::deactivate(unsigned int portId, Wait wait) {
    CompDesc_t own = getTgtDesc();
    command(ClusterDeactivate_t(own, portId), nullptr, wait);
}

void Cluster::assignSlots(unsigned int portId, unsigned int encoding, unsigned int idlePattern,
                          staticList<unsigned int>& slotIds, Wait wait) {
    CompDesc_t own = getTgtDesc();
    command(ClusterSlotAssign_t(own, portId, encoding, idlePattern, slotIds), nullptr, wait);
}

void Cluster::unassignSlots(unsigned int portId, Wait wait) {
    CompDesc_t own = getTgtDesc();
    command(ClusterSlotUnassign_t(own, portId), nullptr, wait);
}

void Cluster::slots(unsigned int portId, ClusterSlotInfoResult_t* reply, Wait wait) {
    CompDesc_t own = getTgtDesc();
    command(ClusterSlotInfo_t(own, portId), reply, wait);
}

staticList<CompDesc_t> Cluster::components(Wait wait) {
    CompDesc_t own = getTgtDesc();
    ClusterCompInfoResult_t reply;
    command(ClusterCompInfo_t(own), &reply, wait);
    return reply.instances;
}

void Cluster::lock(Wait wait) {
    CompDesc_t own = getTgtDesc();
    command(ClusterLock_t(own), nullptr, wait);
}

void Cluster::unlock(ClusterUnlockCmplt_t* reply, Wait wait) {
    CompDesc_t own = getTgtDesc();
    command(ClusterUnlock_t(own), reply, wait);
}

}  // namespace vela

#include "vela/ClusterMgr.h"

namespace vela {

ClusterMgr::ClusterMgr(const Addressable* object)
    : WithBodies(CompDesc_t(0, object->getTgtDesc().Board, 0, 0, 0), *object) {}

template <typename Cmd>
Cluster ClusterMgr::clusterFrom(Cmd&& cmd, Wait wait) {
    ClusterResult_t reply;
    command(cmd, &reply, wait);
    return Cluster(reply.desc, *this);
}

Cluster ClusterMgr::find(CompDesc_t start, staticList<CompAttr_t>& attributes, Wait wait) {
    return clusterFrom(ClusterFind_t(start, attributes), wait);
}

Cluster ClusterMgr::allocate(CompDesc_t start, staticList<CompAttr_t>& attributes, Wait wait) {
    return clusterFrom(ClusterAllocate_t(start, attributes), wait);
}

Cluster ClusterMgr::create(CompDesc_t start, staticList<CompAttr_t>& attributes, Wait wait) {
    return clusterFrom(ClusterCreate_t(start, attributes), wait);
}

Cluster ClusterMgr::byComponent(CompDesc_t instance, Wait wait) {
    return clusterFrom(ClusterByComp_t(instance), wait);
}

StdResource ClusterMgr::componentByAttr(CompDesc_t cluster, unsigned int compType,
                                        staticList<CompAttr_t>& attributes, Wait wait) {
    ComponentResult_t reply;
    command(ClusterCompByAttr_t(cluster, compType, attributes), &reply, wait);
    return StdResource(reply.desc, *this);
}

}  // namespace vela

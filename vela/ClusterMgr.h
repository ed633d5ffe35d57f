// A board's cluster manager. A cluster groups component instances that share a time-division bus.
#ifndef VELA_CLUSTERMGR_H
#define VELA_CLUSTERMGR_H

#include "vela/Cluster.h"
#include "vela/ManagerMessages.h"
#include "vela/StdResource.h"

namespace vela {

struct ClusterMgrMessages : Family<ClusterMgrMessages>, ManagerMessages {
    // clang-format off
    struct ClusterByComp_t : Command<8388637, ClusterResult_t, rows::DescOnly> { using Command::Command; };
    struct ClusterCompByAttr_t : Command<8388638, ComponentResult_t, rows::ClusterCompByAttr> { using Command::Command; };
    struct ClusterCreate_t : Command<8388640, ClusterResult_t, rows::CompStartAttr> { using Command::Command; };
    struct ClusterDestroy_t : Command<8388644, ResultComplete_t, rows::ClustDescOnly> { using Command::Command; };
    struct ClusterAllocate_t : Command<8388689, ClusterResult_t, rows::CompStartAttr> { using Command::Command; };
    struct ClusterFree_t : Command<8388690, ResultComplete_t, rows::ClustDescOnly> { using Command::Command; };
    struct ClusterFind_t : Command<8388691, ClusterResult_t, rows::CompStartAttr> { using Command::Command; };
    // clang-format on

    // ResultComplete_t is not in the table: its code is below the first code of this family.
    using Bodies =
        BodyTable<ComponentResult_t, ClusterByComp_t, ClusterCompByAttr_t, ClusterCreate_t, ClusterDestroy_t,
                  ClusterResult_t, ClusterAllocate_t, ClusterFree_t, ClusterFind_t>;
};

class ClusterMgr : public WithBodies<Addressable, ClusterMgrMessages> {
  public:
    // The cluster manager of the object's board. It uses the object's queue and time-outs.
    explicit ClusterMgr(const Addressable* object);
    explicit ClusterMgr(const Addressable& object) : ClusterMgr(&object) {}
    ~ClusterMgr() override { endCallbacks(); }

    // Commands, each with its fields; WithBodies::send sends a prepared one. All throw Timeout, and
    // UnexpectedMsg, also when nothing is found. StdResource.h describes what they have in common.

    // Finds a cluster with the attributes, allocates one to the caller, or creates a new one.
    Cluster find(CompDesc_t start, staticList<CompAttr_t>& attributes, Wait wait = {});
    Cluster allocate(CompDesc_t start, staticList<CompAttr_t>& attributes, Wait wait = {});
    Cluster create(CompDesc_t start, staticList<CompAttr_t>& attributes, Wait wait = {});

    // free gives back what allocate gave; destroy ends what create made.
    void free(CompDesc_t cluster, Wait wait = {}) { command(ClusterFree_t(cluster), nullptr, wait); }
    void destroy(CompDesc_t cluster, Wait wait = {}) { command(ClusterDestroy_t(cluster), nullptr, wait); }

    // Finds the cluster of which a component instance is a member.
    Cluster byComponent(CompDesc_t instance, Wait wait = {});
    // Finds the first member of a cluster with this type and these attributes.
    StdResource componentByAttr(CompDesc_t cluster, unsigned int compType, staticList<CompAttr_t>& attributes,
                                Wait wait = {});

  private:
    template <typename Cmd>
    Cluster clusterFrom(Cmd&& cmd, Wait wait);
};

}  // namespace vela

#endif

// The message families and the names of their bodies, for tests that go over all of them.
#ifndef TESTS_VELA_FAMILIES_H
#define TESTS_VELA_FAMILIES_H

#include <cxxabi.h>

#include <cstdlib>
#include <memory>
#include <string>
#include <typeinfo>

#include "vela/CCS.h"
#include "vela/ClusterMgr.h"
#include "vela/ResourceMgr.h"
#include "vela/TSCComponent.h"

// "MsgSetParm_t".
template <typename BodyType>
std::string nameOf() {
    const std::unique_ptr<char, void (*)(void*)> whole(
        abi::__cxa_demangle(typeid(BodyType).name(), nullptr, nullptr, nullptr), &std::free);
    const std::string name(whole.get());
    return name.substr(name.rfind(':') + 1);
}

// The code of the body that answers, or null.
template <typename BodyType>
const unsigned int* replyCode() {
    if constexpr (requires { typename BodyType::Reply; })
        return &BodyType::Reply::code;
    else
        return nullptr;
}

// Calls visit.template operator()<Table>(file, title) for each family.
template <typename Visit>
void forEachFamily(Visit visit) {
    visit.template operator()<vela::StdResource::Bodies>("standard_resource", "Standard resource");
    visit.template operator()<vela::TSCComponent::Bodies>("tsc", "TSC component");
    visit.template operator()<vela::CCS::Bodies>("ccs", "CCS component");
    visit.template operator()<vela::CCS::Events>("ccs_events", "CCS component, by event group");
    visit.template operator()<vela::ResourceMgr::Bodies>("resource_mgr", "Resource manager");
    visit.template operator()<vela::ClusterMgr::Bodies>("cluster_mgr", "Cluster manager");
    visit.template operator()<vela::Cluster::Bodies>("cluster", "Cluster");
}

#endif

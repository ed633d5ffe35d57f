#include "vela/ResourceMgr.h"

#include <algorithm>
#include <vector>

namespace vela {

namespace {

CompDesc_t managerOf(const CompDesc_t& any) { return {0, any.Board, 0, 0, 0}; }

// Adds the type to the attributes of a search, unless it is 0, which stands for any type.
void addType(staticList<CompAttr_t>& attributes, unsigned char compType) {
    if (compType == 0)
        return;
    attributes.realloc(attributes.length() + 1);
    attributes[attributes.length() - 1] = CompAttr_t(CompAttr_t::componentType, compType);
}

void append(ResourceMgr::Found& all, const ResourceMgr::Found& more) {
    const unsigned int before = all.length();
    all.realloc(before + more.length());
    std::copy(more.begin(), more.end(), all.begin() + before);
}

}  // namespace

ResourceMgr::ResourceMgr(const Addressable* object) : WithBodies(managerOf(object->getTgtDesc()), *object) {}

CompDesc_t ResourceMgr::searchStart(unsigned char processor, unsigned short instance) const {
    const CompDesc_t own = getTgtDesc();
    return {instance, own.Board, processor, CompDesc_t::anyComponent, own.Node};
}

StdResource ResourceMgr::find(unsigned char compType, unsigned char processor, unsigned short instance,
                              staticList<CompAttr_t> attributes, Wait wait) {
    CompDesc_t start = searchStart(processor, instance);
    addType(attributes, compType);
    ComponentResult_t found;
    command(CompFind_t(start, attributes), &found, wait);
    return StdResource(found.desc, *this);
}

// Each reply names the component from which to continue. The search ends when a reply names none, or one that
// was named before.
ResourceMgr::Found ResourceMgr::findAll(CompDesc_t start, CompDesc_t end, staticList<CompAttr_t> attributes,
                                        Wait wait) {
    Found all;
    std::vector<CompDesc_t> starts;
    while (std::find(starts.begin(), starts.end(), start) == starts.end()) {
        starts.push_back(start);
        CompMultipleResult_t reply;
        command(CompFindAll_t(start, end, attributes), &reply, wait);
        append(all, reply.comps);
        start = reply.nextComponent;
        if (reply.comps->length() == 0 || start == CompDesc_t())
            break;
    }
    return all;
}

ResourceMgr::Found ResourceMgr::findAll(unsigned char compType, Wait wait) {
    const CompDesc_t own = getTgtDesc();
    staticList<CompAttr_t> attributes;
    addType(attributes, compType);
    return findAll({0, own.Board, 0, 0, own.Node}, {0xFFFF, own.Board, 0xFF, 0xFF, own.Node}, attributes,
                   wait);
}

staticList<CompAttr_t> ResourceMgr::attributes(CompDesc_t component, unsigned int count, unsigned int offset,
                                               Wait wait) {
    CompAttrInfoResult_t reply;
    command(CompAttrInfo_t(component, count, offset), &reply, wait);
    return reply.attrs;
}

StdResource ResourceMgr::allocate(unsigned char compType, unsigned char processor, CompDesc_t cluster,
                                  staticList<CompAttr_t> attributes, Wait wait) {
    CompDesc_t start = searchStart(processor, 0);
    addType(attributes, compType);
    ComponentResult_t found;
    command(CompInstAllocate_t(start, cluster, attributes), &found, wait);
    return StdResource(found.desc, *this);
}

void ResourceMgr::use(const CompDesc_t& component, unsigned int payload, Wait wait) {
    staticList<CompUse_t::List_t> uses(1);
    uses[0].desc = component;
    uses[0].Payload = payload;
    use(uses, wait);
}

void ResourceMgr::unuse(const CompDesc_t& component, Wait wait) {
    staticList<CompUnuse_t::List_t> uses(1);
    uses[0].desc = component;
    unuse(uses, wait);
}

}  // namespace vela

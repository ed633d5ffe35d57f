// The commands that a board's managers answer: finding components and reserving them.
#include <algorithm>
#include <tuple>
#include <vector>

#include "softboard/answers.h"

namespace softboard {

namespace {

struct Search {
    Address start;  // processor and component 255: any
    std::optional<uint32_t> type;

    bool matches(const Component& component) const {
        const auto fits = [](uint8_t wanted, uint8_t is) { return wanted == anyNumber || wanted == is; };
        const Address& is = component.address;
        return start.node == is.node && start.board == is.board && fits(start.processor, is.processor) &&
               fits(start.component, is.component) && start.instance == is.instance &&
               (!type || *type == component.type);
    }
};

// Reads a count, and then a key and a value for each attribute. Only the component type narrows the search;
// other keys are ignored.
void readAttributes(BodyReader& body, Search& search) {
    for (uint32_t left = body.u32(); left > 0 && body.ok(); --left) {
        const uint32_t key = body.u32();
        const uint32_t value = body.u32();
        if (key == componentTypeKey) {
            search.type = value;
        }
    }
}

void answerFound(Request& request, const Search& search) {
    if (!request.body.ok()) {
        request.refuse(ErrorCode::bodyTooShort);
        return;
    }
    const auto& components = request.board.components();
    const auto found = std::find_if(components.begin(), components.end(),
                                    [&](const Component& component) { return search.matches(component); });
    if (found == components.end()) {
        request.refuse(ErrorCode::nothingFound);
        return;
    }
    request.reply.address(found->address);
}

void find(Request& request) {
    Search search{request.body.address(), {}};
    readAttributes(request.body, search);
    answerFound(request, search);
}

// The order in which components are listed.
auto place(const Address& a) { return std::tuple(a.node, a.board, a.processor, a.component, a.instance); }

// Lists the components from the first address to the last, in order. A reply holds mostFound of them; it
// names the next one, or address 0 when there are no more.
void findAll(Request& request) {
    const Address first = request.body.address();
    const Address last = request.body.address();
    Search search;
    readAttributes(request.body, search);
    if (!request.body.ok()) {
        request.refuse(ErrorCode::bodyTooShort);
        return;
    }
    std::vector<const Component*> found;
    for (const Component& component : request.board.components()) {
        const auto is = place(component.address);
        if (place(first) <= is && is <= place(last) && (!search.type || *search.type == component.type)) {
            found.push_back(&component);
        }
    }
    std::sort(found.begin(), found.end(),
              [](const Component* a, const Component* b) { return place(a->address) < place(b->address); });
    const size_t told = std::min(found.size(), mostFound);
    request.reply.u32(static_cast<uint32_t>(told));
    request.reply.address(told < found.size() ? found[told]->address : Address());
    for (size_t i = 0; i < told; ++i) {
        request.reply.address(found[i]->address).u32(componentTypeKey).u32(found[i]->type);
    }
}

// A component has one attribute, its type.
void attributes(Request& request) {
    const Address address = request.body.address();
    const uint32_t count = request.body.u32();
    const uint32_t offset = request.body.u32();
    if (!request.body.ok()) {
        request.refuse(ErrorCode::bodyTooShort);
        return;
    }
    const Component* component = request.board.at(address);
    if (component == nullptr) {
        request.refuse(ErrorCode::noSuchComponent);
        return;
    }
    const bool told = count > 0 && offset == 0;
    request.reply.address(address).u32(told ? 1 : 0);
    if (told) {
        request.reply.u32(componentTypeKey).u32(component->type);
    }
}

void allocate(Request& request) {
    Search search{request.body.address(), {}};
    request.body.address();  // the cluster
    readAttributes(request.body, search);
    answerFound(request, search);
}

constexpr Answer answers[] = {
    {compAttrInfo, compAttrInfoResult, At::managers, attributes},
    {compFind, componentResult, At::managers, find},
    {compFindAll, compMultipleResult, At::managers, findAll},
    {compInstAllocate, componentResult, At::managers, allocate},
    {compInstFree, resultComplete, At::both, acknowledge},
    {compUse, resultComplete, At::both, acknowledge},
    {compUnuse, resultComplete, At::both, acknowledge},
};

}  // namespace

std::span<const Answer> managerAnswers() { return answers; }

}  // namespace softboard

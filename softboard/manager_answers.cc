// What a board's managers answer: finding components and reserving them.
#include <algorithm>

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

// A count, then key and value of each; keys other than the component type do not narrow the search.
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

void allocate(Request& request) {
    Search search{request.body.address(), {}};
    request.body.address();  // the cluster
    readAttributes(request.body, search);
    answerFound(request, search);
}

constexpr Answer answers[] = {
    {compFind, componentResult, At::managers, find},
    {compInstAllocate, componentResult, At::managers, allocate},
    {compInstFree, resultComplete, At::both, acknowledge},
    {compUse, resultComplete, At::both, acknowledge},
    {compUnuse, resultComplete, At::both, acknowledge},
};

}  // namespace

std::span<const Answer> managerAnswers() { return answers; }

}  // namespace softboard

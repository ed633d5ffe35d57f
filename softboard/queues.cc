#include "softboard/queues.h"

#include <algorithm>

#include "softboard/misuse.h"

namespace softboard {

namespace {

// No handle is NVSTATUS_ERROR, because nvQueueOpen returns that when it opens no queue.
constexpr uint32_t firstHandle = 100;
// Boards have node 0, so that no host address is a board's.
constexpr uint8_t hostNode = 1;

}  // namespace

Queues::Queues() : nextHandle_(firstHandle) {}

uint32_t Queues::open() {
    const uint32_t handle = nextHandle_++;
    queues_[handle] = std::make_shared<Queue>();
    return handle;
}

std::shared_ptr<Queue> Queues::find(const char* function, uint32_t handle) const {
    const auto found = queues_.find(handle);
    if (found != queues_.end()) {
        return found->second;
    }
    if (handle < firstHandle || handle >= nextHandle_) {
        misuse(function, "there is no queue " + std::to_string(handle));
    }
    return nullptr;
}

std::shared_ptr<Queue> Queues::get(const char* function, uint32_t handle) const {
    auto queue = find(function, handle);
    if (!queue) {
        misuse(function, "queue " + std::to_string(handle) + " was closed before");
    }
    return queue;
}

void Queues::close(uint32_t handle) {
    const auto queue = queues_.at(handle);
    queue->open = queue->bound = false;
    queue->arrived.notify_all();
    queues_.erase(handle);
}

Address Queues::bind(Queue& queue) {
    Address host;
    host.node = hostNode;
    do {
        host.instance = ++lastInstance_;
    } while (host.instance == 0 || at(host) != nullptr);
    queue.host = host;
    queue.bound = queue.everBound = true;
    return host;
}

Queue* Queues::at(const Address& host) const {
    const auto found = std::find_if(queues_.begin(), queues_.end(), [&](const auto& entry) {
        return entry.second->bound && entry.second->host == host;
    });
    return found == queues_.end() ? nullptr : found->second.get();
}

}  // namespace softboard

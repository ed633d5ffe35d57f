#include "softboard/network.h"

#include "softboard/misuse.h"

namespace softboard {

Network::Network(const Scenario& scenario) { setUp(scenario); }

Network::~Network() { shutDown(); }

void Network::setUp(const Scenario& scenario) {
    std::vector<std::shared_ptr<const Frames>> captures;
    for (const Frames& frames : scenario.captures) {
        captures.push_back(std::make_shared<const Frames>(frames));
    }
    for (const DChannel& channel : scenario.channels) {
        Board& board = boards_.try_emplace(channel.board, channel.board).first->second;
        board.add(ccsComponent(channel, captures.at(channel.capture)));
    }
    setFaultsLocked(scenario.faults);
}

void Network::reset(const Scenario& scenario) {
    const std::lock_guard guard(lock_);
    boards_.clear();
    setUp(scenario);
    journal_.clear();
    changed_.notify_all();
}

void Network::setFaults(const std::vector<Fault>& faults) {
    const std::lock_guard guard(lock_);
    setFaultsLocked(faults);
    changed_.notify_all();
}

void Network::setFaultsLocked(const std::vector<Fault>& faults) {
    misbehaviour_ = Misbehaviour(faults);
    leavesOffset_ = misbehaviour_.has(FaultKind::offsetStays0);
}

NvMsg32Bit* Network::allocate(uint32_t size) {
    {
        const std::lock_guard guard(lock_);
        if (misbehaviour_.fails(FaultKind::allocateFails)) {
            return nullptr;
        }
    }
    return buffers_.allocate(size);
}

uint32_t Network::openQueue() {
    const std::lock_guard guard(lock_);
    return misbehaviour_.fails(FaultKind::openFails) ? uint32_t{NVSTATUS_ERROR} : queues_.open();
}

uint32_t Network::bindQueue(uint32_t handle, NvCompDesc& host) {
    const std::lock_guard guard(lock_);
    const auto queue = queues_.get("nvQueueBind", handle);
    if (queue->bound) {
        misuse("nvQueueBind", "queue " + std::to_string(handle) + " is bound already");
    }
    if (misbehaviour_.fails(FaultKind::bindFails)) {
        return NVSTATUS_ERROR;
    }
    host = compDescOf(queues_.bind(*queue));
    changed_.notify_all();  // frames may wait for a queue with this address
    return NVSTATUS_OK;
}

void Network::unbindQueue(uint32_t handle, const NvCompDesc& host) {
    const std::lock_guard guard(lock_);
    const auto queue = queues_.get("nvQueueUnbind", handle);
    if (!queue->bound || queue->host != addressOf(host)) {
        misuse("nvQueueUnbind",
               "queue " + std::to_string(handle) + " is not bound to " + toString(addressOf(host)));
    }
    queue->bound = false;
    forget(queue->host);
}

void Network::closeQueue(uint32_t handle) {
    const std::lock_guard guard(lock_);
    const auto queue = queues_.get("nvQueueClose", handle);
    const bool bound = queue->bound;
    queues_.close(handle);
    if (bound) {
        forget(queue->host);
    }
    for (const NvMsg32Bit* msg : queue->waiting) {
        buffers_.release(msg);
    }
    queue->waiting.clear();
}

// Ends all subscriptions of the address, on all boards.
void Network::forget(const Address& host) {
    for (auto& [number, board] : boards_) {
        for (Component& component : board.components()) {
            component.forget(host);
        }
    }
    updatePlayers();
}

NvMsg32Bit* Network::read(uint32_t handle) {
    std::unique_lock guard(lock_);
    const auto queue = queues_.find("nvMsgRead", handle);
    if (!queue) {
        return nullptr;
    }
    if (!queue->everBound) {
        misuse("nvMsgRead", "queue " + std::to_string(handle) + " was never bound: nothing can arrive");
    }
    queue->arrived.wait(guard, [&] { return !queue->open || !queue->waiting.empty(); });
    if (!queue->open) {
        return nullptr;
    }
    NvMsg32Bit* msg = queue->waiting.front();
    queue->waiting.pop_front();
    if (queue->waiting.size() + 1 == mostWaiting) {
        changed_.notify_all();
    }
    buffers_.handOut(msg);
    return msg;
}

void Network::write(uint32_t handle, NvMsg32Bit* msg) {
    const std::lock_guard guard(lock_);
    if (!queues_.get("nvMsgWrite", handle)->bound) {
        misuse("nvMsgWrite", "queue " + std::to_string(handle) + " is not bound");
    }
    buffers_.takeOver("nvMsgWrite", msg);
    const Message message = messageOf(*msg);
    if (Queue* queue = queues_.at(message.target); queue != nullptr) {
        journal_.add(Journal::Way::hostToHost, message);
        queue->waiting.push_back(msg);
        queue->arrived.notify_one();
        return;
    }
    buffers_.release(msg);
    toBoard(message);
}

// A command to a board that does not exist is lost, as with an empty slot: the host's time-out ends the wait.
void Network::toBoard(const Message& command) {
    const auto board = boards_.find(command.target.board);
    if (board == boards_.end() || command.target.node != board->second.address().node) {
        journal_.add(Journal::Way::hostToNobody, command);
        return;
    }
    journal_.add(Journal::Way::hostToBoard, command);
    if (!misbehaviour_.silent()) {
        answer(board->second, command);
        updatePlayers();
    }
}

void Network::answer(Board& board, const Message& command) {
    const Messages beside = misbehaviour_.beside(command);
    for (const Message& event : beside) {
        toHost(event);
    }
    if (const auto reply = board.answer(command); reply) {
        for (const Message& sent : misbehaviour_.repliesFor(command, *reply)) {
            toHost(sent);
        }
    }
    for (const Message& event : beside) {
        toHost(event);
    }
}

bool Network::toHost(const Message& message) {
    Queue* queue = queues_.at(message.target);
    NvMsg32Bit* msg =
        queue == nullptr ? nullptr : buffers_.allocate(static_cast<uint32_t>(message.body.size()));
    if (msg == nullptr) {
        journal_.add(Journal::Way::boardToNobody, message);
        return false;
    }
    store(message, *msg);
    buffers_.takeOver("nvMsgWrite", msg);
    journal_.add(Journal::Way::boardToHost, message);
    queue->waiting.push_back(msg);
    queue->arrived.notify_one();
    return true;
}

bool Network::inject(const Message& message) {
    const std::lock_guard guard(lock_);
    return toHost(message);
}

size_t Network::openQueues() const {
    const std::lock_guard guard(lock_);
    return queues_.openCount();
}

std::string Network::balance() const {
    return "buffers outstanding " + std::to_string(buffers_.outstanding()) + ", queues open " +
           std::to_string(openQueues());
}

void Network::shutDown() {
    {
        const std::lock_guard guard(lock_);
        ending_ = true;
        changed_.notify_all();
    }
    if (player_.joinable()) {
        player_.join();
    }
}

}  // namespace softboard

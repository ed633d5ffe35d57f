#include "relay/forwarder.h"

#include "relay/ended.h"

namespace relay {

Forwarder::Forwarder(TransportQueue& queue, Stream& host)
    : queue_(queue), host_(host), thread_([this] { run(); }) {}

Forwarder::~Forwarder() {
    if (!thread_.joinable())
        return;
    host_.shutDown();
    stop();
}

void Forwarder::catchUp() {
    {
        const std::lock_guard guard(lock_);
        ++marks_;
    }
    if (!queue_.mark())
        throw Ended("the transport library takes no message");
    std::unique_lock guard(lock_);
    changed_.wait(guard, [this] { return marks_ == 0 || !failure_.empty(); });
    if (!failure_.empty())
        throw Ended(failure_);
}

void Forwarder::finish() {
    catchUp();
    stop();
}

void Forwarder::check() {
    const std::lock_guard guard(lock_);
    if (!failure_.empty())
        throw Ended(failure_);
}

void Forwarder::stop() {
    stopping_ = true;
    if (!queue_.mark())
        queue_.close();
    thread_.join();
}

void Forwarder::run() {
    try {
        while (forward(queue_.read())) {
        }
    } catch (const std::exception& error) {
        fail(error.what());
    }
}

// Sends one message. Returns false when the thread is to end.
bool Forwarder::forward(Message msg) {
    if (stopping_)
        return false;
    if (msg == nullptr)
        throw Ended("the transport library reads no more");
    if (queue_.isMark(*msg) && met())
        return true;
    if (msg->size > largestPart)
        throw Ended("a message of " + std::to_string(msg->size) + " octets from the board");
    host_.write(encodeMessage(*msg));
    return true;
}

// Notes that a mark has been read and wakes catchUp(). Returns false when nobody waits for a mark: the
// message is then one that the host sent to itself, and is forwarded.
bool Forwarder::met() {
    const std::lock_guard guard(lock_);
    if (marks_ == 0)
        return false;
    --marks_;
    changed_.notify_all();
    return true;
}

void Forwarder::fail(const std::string& why) {
    {
        const std::lock_guard guard(lock_);
        failure_ = why;
        changed_.notify_all();
    }
    host_.shutDown();
}

}  // namespace relay

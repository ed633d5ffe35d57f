#include "relay/client.h"

#include <utility>

#include "relay/ended.h"

namespace relay {

namespace {

// After this many messages the relay reads no more from a host until the host has taken everything in its
// queue. So the queue of a host that does not read stays short.
constexpr unsigned mostAhead = 64;

std::string text(const NvCompDesc& address) {
    return std::to_string(address.node) + "." + std::to_string(address.board) + "." +
           std::to_string(address.processor) + "." + std::to_string(address.component) + "." +
           std::to_string(address.instance);
}

void checkType(const Frame& frame, std::uint32_t type) {
    if (frame.header.type != type)
        throw Ended("a frame of type " + std::to_string(frame.header.type) + " instead of " +
                    std::to_string(type));
}

}  // namespace

Client::Client(Descriptor socket, std::string name, Patience patience, Log log, std::function<void()> ended)
    : host_(std::move(socket), patience),
      name_(std::move(name)),
      log_(std::move(log)),
      thread_([this, onEnd = std::move(ended)] { run(onEnd); }) {}

Client::~Client() {
    abort();
    thread_.join();
}

void Client::drain() {
    draining_ = true;
    host_.shutDownReading();
}

void Client::abort() { host_.shutDown(); }

void Client::run(const std::function<void()>& ended) {
    try {
        serve();
        log_(name_ + ": closed");
    } catch (const std::exception& why) {
        log_(name_ + ": ended: " + why.what());
    }
    host_.shutDown();
    ended_ = true;
    ended();
}

void Client::serve() {
    const Frame request = host_.readFirstFrame();
    checkType(request, frame_type::open);
    if (request.data.size() != openRequestSize)
        throw Ended("an open request of " + std::to_string(request.data.size()) + " octets");
    TransportQueue queue;
    host_.write(encodeFrame(frame_type::opened, request.header.transaction, encodeAddress(queue.address())));
    log_(name_ + ": opened " + text(queue.address()));
    Forwarder forwarder(queue, host_);
    const Octets lastWord = converse(queue, forwarder);
    forwarder.finish();
    host_.write(lastWord);
}

// Carries messages from the host to the boards until the connection ends. Returns the last frame to send to
// the host: that the relay has closed the queue as asked, or that it closes by itself (drain).
Octets Client::converse(TransportQueue& queue, Forwarder& forwarder) {
    try {
        return encodeFrame(frame_type::closed, takeMessages(queue, forwarder));
    } catch (const Ended&) {
        forwarder.check();  // if the forwarder ended the connection, its reason is the one to report
        if (!draining_)
            throw;
        return encodeFrame(frame_type::close, 0);
    }
}

// Carries messages until the host asks to close. Returns the transaction of that request.
std::uint32_t Client::takeMessages(TransportQueue& queue, Forwarder& forwarder) {
    for (unsigned ahead = 1;; ++ahead) {
        const Frame frame = host_.readFrame();
        if (frame.header.type == frame_type::close)
            return frame.header.transaction;
        checkType(frame, frame_type::message);
        static_cast<void>(queue.write(decodeMessage(frame)));  // if it is lost, the host's time-out notices
        if (ahead % mostAhead == 0)
            forwarder.catchUp();
    }
}

}  // namespace relay

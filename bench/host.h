// The smallest possible host: sends commands to D channel 1 of board 1 and reads messages, without the object
// layer.
#ifndef BENCH_HOST_H
#define BENCH_HOST_H

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <memory>
#include <utility>
#include <vector>

#include "hostsvc/KSAbstractMsgQueue.h"
#include "hostsvc/KSMsgRef.h"

namespace bench {

class Host {
  public:
    explicit Host(std::unique_ptr<KSAbstractMsgQueue> queue) : queue_(std::move(queue)) {}

    void askProtocol() {
        tell(getParm, {protocolParm, 0, 0, 0});
        hear();
    }

    // Subscribes, switches the trace on, and reads up to and including the first event.
    void startTrace() {
        tell(detectEvt, detectBody());
        tell(setParm, {traceParm, 0, 0, 0, 1, 0, 0, 0});
        while (!hearEvent()) {
        }
    }
    void endTrace() {
        tell(setParm, {traceParm, 0, 0, 0, 0, 0, 0, 0});
        while (hear() != setParm + 1) {
        }
    }

    // Waits for the next message and frees it. Returns whether it was an event.
    bool hearEvent() { return hear() == evtDetected; }

  private:
    static constexpr NvCompDesc ccs{1, 1, 0, 1, 0x15, 0, 0};
    static constexpr unsigned setParm = 8;
    static constexpr unsigned getParm = 18;
    static constexpr unsigned detectEvt = 22;
    static constexpr unsigned evtDetected = 32;
    static constexpr std::uint8_t traceParm = 10;
    static constexpr std::uint8_t protocolParm = 7;

    void tell(unsigned type, const std::vector<std::uint8_t>& body) {
        KSMsgRef msg(static_cast<unsigned>(body.size()));
        msg.setMsgType(type);
        msg.setSrcAddr(queue_->getHostDesc());
        msg.setTgtAddr(ccs);
        std::memcpy(msg.getMsgRef() + 1, body.data(), body.size());
        queue_->msgWrite(msg.getMsgRef());
    }

    // Waits for the next message, frees it and returns its type. Ends the process when the queue cannot be
    // read.
    unsigned hear() {
        NvMsg32Bit* read = nullptr;
        if (queue_->msgRead(&read) != 0) {
            std::cerr << "the transport cannot be read any more" << std::endl;
            std::exit(EXIT_FAILURE);
        }
        KSMsgRef msg(read);
        const unsigned type = msg.getMsgType();
        msg.free();
        return type;
    }

    std::vector<std::uint8_t> detectBody() const {
        const NvCompDesc host = queue_->getHostDesc();
        return {static_cast<std::uint8_t>(host.instance),
                static_cast<std::uint8_t>(host.instance >> 8),
                host.board,
                host.processor,
                host.component,
                host.node,
                2,
                0,
                0,
                0,
                0,
                0,
                0,
                0};
    }

    std::unique_ptr<KSAbstractMsgQueue> queue_;
};

}  // namespace bench

#endif

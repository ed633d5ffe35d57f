// Messages with a given payload, on the scripted transport.
#ifndef TESTS_FUZZ_PAYLOAD_H
#define TESTS_FUZZ_PAYLOAD_H

#include <algorithm>
#include <memory>

#include "tests/fuzz/fuzz.h"
#include "tests/support/fake_norv.h"
#include "vela/Msg.h"

namespace fuzz {

// A fresh transport for its lifetime; at its end every buffer must have been given back, none misused.
class Transport {
  public:
    Transport() { fake_norv::reset(); }
    ~Transport() {
        require(fake_norv::outstanding() == 0, "every buffer is given back");
        require(fake_norv::misuses().empty(), "no buffer is misused");
        fake_norv::reset();
    }
    Transport(const Transport&) = delete;
    Transport& operator=(const Transport&) = delete;
};

inline std::unique_ptr<vela::Msg> messageOf(const Octets& payload) {
    auto msg = std::make_unique<vela::Msg>(static_cast<unsigned int>(payload.size()));
    std::copy(payload.begin(), payload.end(),
              reinterpret_cast<std::uint8_t*>(msg->getNvMsgRef()) + NVMSG_HEADER_SIZE);
    return msg;
}

}  // namespace fuzz

#endif

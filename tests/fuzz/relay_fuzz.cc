// What a connection brings, read by the relay and by the host: the relay takes no frame that the host would
// read otherwise, and a message that it takes goes out again as it came.
#include <sys/socket.h>
#include <unistd.h>

#include "hostsvc/KSHeaderBlock.h"
#include "hostsvc/sock.h"
#include "relay/ended.h"
#include "relay/message.h"
#include "relay/stream.h"
#include "tests/fuzz/payload.h"

namespace {

// The reading end of a connection on which these octets came, and nothing more will.
int arrived(const fuzz::Octets& octets) {
    int ends[2];
    fuzz::require(socketpair(AF_UNIX, SOCK_STREAM, 0, ends) == 0, "a pair of sockets");
    fuzz::require(
        send(ends[0], octets.data(), octets.size(), MSG_DONTWAIT) == static_cast<ssize_t>(octets.size()),
        "an input that fits into a socket");
    close(ends[0]);
    return ends[1];
}

void takeMessage(const relay::Frame& frame) {
    const relay::Message msg = relay::decodeMessage(frame);
    const relay::Octets again = relay::encodeMessage(*msg);
    const relay::Octets expected = relay::encodeFrame(relay::frame_type::message, 0, frame.data, frame.extra);
    fuzz::require(again == expected, "a message goes out as it came");
}

// The frames that the relay takes, messages or not.
std::vector<relay::Frame> readByRelay(const fuzz::Octets& octets) {
    relay::Stream stream(relay::Descriptor(arrived(octets)), {});
    std::vector<relay::Frame> frames;
    try {
        frames.push_back(stream.readFirstFrame());
        while (true)
            frames.push_back(stream.readFrame());
    } catch (const relay::Ended&) {
    }
    for (const relay::Frame& frame : frames) {
        try {
            takeMessage(frame);
        } catch (const relay::Ended&) {
        }
    }
    return frames;
}

bool same(const msg_t& m, const relay::Frame& frame) {
    return m.type == frame.header.type && m.tran == frame.header.transaction &&
           relay::Octets(m.data, m.data + m.size) == frame.data &&
           relay::Octets(m.ex_data, m.ex_data + m.ex_size) == frame.extra;
}

void fillHeader(const msg_t& m) {
    NvMsg32Bit header{};
    ks_fillHeader(header, m.data, m.size);
    if (m.size == relay::headerBlockSize) {
        const KSHeaderBlock block = ks_headerBlock(header);
        fuzz::require(block[2] == *reinterpret_cast<const std::uint32_t*>(m.data + 8), "a type is kept");
    }
}

void readByHost(const fuzz::Octets& octets, const std::vector<relay::Frame>& taken) {
    sock connection(arrived(octets));
    std::size_t frames = 0;
    while (!connection.failed()) {
        msg_t m;
        if (connection.get_msg(m) == 0) {
            fuzz::require(m.data[m.size] == 0 && m.ex_data[m.ex_size] == 0, "a zero octet behind each part");
            fuzz::require(frames >= taken.size() || same(m, taken[frames]),
                          "the host reads what the relay reads");
            fillHeader(m);
            ++frames;
        }
        free_msg(m);
    }
    fuzz::require(frames >= taken.size(), "the host reads every frame that the relay reads");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const fuzz::Transport transport;
    const fuzz::Octets octets(data, data + size);
    readByHost(octets, readByRelay(octets));
    return 0;
}

#include "softboard/capture.h"

#include <pcap/pcap.h>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <memory>

#include "softboard/codes.h"
#include "softboard/settings.h"

namespace softboard {

namespace {

constexpr int linuxLapd = 177;
constexpr int plainLapd = 203;
constexpr size_t pseudoHeader = 16;
constexpr uint16_t outgoing = 4;  // the pseudo-header's packet type of a frame that this side sent
constexpr size_t longestFrame = 65535;
constexpr size_t mostFrames = 500000;

struct CloseCapture {
    void operator()(pcap_t* capture) const { pcap_close(capture); }
};
using Capture = std::unique_ptr<pcap_t, CloseCapture>;

Capture open(const std::string& path) {
    FILE* file = std::fopen(path.c_str(), "rb");
    if (file == nullptr) {
        throw BadInput(path + ": " + std::strerror(errno));
    }
    char reason[PCAP_ERRBUF_SIZE] = "";
    Capture capture(pcap_fopen_offline(file, reason));
    if (!capture) {
        static_cast<void>(std::fclose(file));  // it was read only
        throw BadInput(path + ": " + reason);
    }
    const int type = pcap_datalink(capture.get());
    if (type != linuxLapd && type != plainLapd) {
        const char* name = pcap_datalink_val_to_name(type);
        throw BadInput(path + ": link type " + std::to_string(type) +
                       (name ? " (" + std::string(name) + ")" : "") +
                       "; a D-channel capture has 177 (LINUX_LAPD) or 203 (LAPD)");
    }
    return capture;
}

// Time since the first frame; a clock that was set back stands still.
uint32_t ticksSince(const timeval& first, const timeval& then, uint32_t least) {
    const double seconds = (static_cast<double>(then.tv_sec) - static_cast<double>(first.tv_sec)) +
                           (static_cast<double>(then.tv_usec) - static_cast<double>(first.tv_usec)) / 1e6;
    const double ticks = std::round(seconds * ticksPerSecond);
    return static_cast<uint32_t>(
        std::clamp(ticks, static_cast<double>(least), static_cast<double>(UINT32_MAX)));
}

class Reader {
  public:
    explicit Reader(const std::string& path) : path_(path), capture_(open(path)) {}

    Frames readAll() {
        Frames frames;
        const bool hasDirection = pcap_datalink(capture_.get()) == linuxLapd;
        pcap_pkthdr* header = nullptr;
        const u_char* data = nullptr;
        timeval first{};
        while (next(header, data)) {
            if (frames.empty()) {
                first = header->ts;
            }
            Frame frame;
            frame.ticks = ticksSince(first, header->ts, frames.empty() ? 0 : frames.back().ticks);
            frame.octets.assign(data + (hasDirection ? pseudoHeader : 0), data + header->caplen);
            frame.transmitted =
                hasDirection ? (data[0] << 8 | data[1]) == outgoing : directions_.isTransmitted(frame.octets);
            frames.push_back(std::move(frame));
        }
        if (frames.empty()) {
            throw BadInput(path_ + ": the capture holds no frame");
        }
        return frames;
    }

  private:
    // False at the end of the file.
    bool next(pcap_pkthdr*& header, const u_char*& data) {
        const int result = pcap_next_ex(capture_.get(), &header, &data);
        if (result == PCAP_ERROR_BREAK) {
            return false;
        }
        ++number_;
        if (result != 1) {
            fail(pcap_geterr(capture_.get()));
        }
        const size_t before = pcap_datalink(capture_.get()) == linuxLapd ? pseudoHeader : 0;
        if (header->caplen < header->len) {
            fail("only " + std::to_string(header->caplen) + " of its " + std::to_string(header->len) +
                 " octets were captured");
        }
        if (header->caplen <= before) {
            fail("it has no octets");
        }
        if (header->caplen - before > longestFrame) {
            fail("it has more than " + std::to_string(longestFrame) + " octets");
        }
        if (number_ > mostFrames) {
            fail("a capture may hold " + std::to_string(mostFrames) + " frames at most");
        }
        return true;
    }

    [[noreturn]] void fail(const std::string& reason) const {
        throw BadInput(path_ + ": frame " + std::to_string(number_) + ": " + reason);
    }

    std::string path_;
    Capture capture_;
    Directions directions_;
    size_t number_ = 0;
};

}  // namespace

Frames readCapture(const std::string& path) { return Reader(path).readAll(); }

bool Directions::isTransmitted(const std::vector<uint8_t>& octets) {
    const auto octet = [&](size_t at) -> uint8_t { return at < octets.size() ? octets[at] : 0; };
    const bool commandResponse = (octet(0) & 0x02) != 0;
    const bool pollFinal = (octet(3) & 0x01) != 0;
    const uint32_t address = octet(0) << 8U | octet(1);
    return isCommand(octet(2), pollFinal, address) != commandResponse;
}

bool Directions::isCommand(uint8_t control, bool pollFinal, uint32_t address) {
    constexpr uint8_t pollFinalBit = 0x10;  // of an unnumbered frame
    if ((control & 0x01) == 0) {
        return true;  // I
    }
    if ((control & 0x03) == 0x03) {
        const int frame = control & ~pollFinalBit;
        return frame != 0x0f && frame != 0x63 && frame != 0x87;  // DM, UA, FRMR
    }
    if (!pollFinal || polled_.erase(address) > 0) {
        return false;
    }
    polled_.insert(address);
    return true;
}

}  // namespace softboard

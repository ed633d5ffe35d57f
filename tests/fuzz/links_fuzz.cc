// Frames of any octets at any times through the links of a D channel and their findings.
#include <set>

#include "calls/DChannel.h"
#include "calls/LinkFindings.h"
#include "tests/fuzz/fuzz.h"

namespace {

class Checked : public calls::FindingSink {
  public:
    void report(calls::Finding finding) override {
        fuzz::require(finding.kind != nullptr && !finding.sentence.empty() && finding.count > 0,
                      "a finding is whole");
    }
};

class Trunk {
  public:
    void take(const fuzz::Octets& octets, bool transmitted, std::int64_t at) {
        capture::Frame frame;
        frame.octets = octets;
        frame.transmitted = transmitted;
        channel_.take(frame, ++number_, at);
        for (const calls::KeptFrame& late : channel_.late())
            accept(late.number);
        if (channel_.marks().accepted.value_or(false))
            accept(number_);
        findings_.take(channel_);
    }
    void restart() {
        channel_.restarted();
        findings_.restarted();
    }
    void lose() {
        channel_.mayMiss("Frames Lost");
        findings_.lost("Frames Lost: 1");
    }
    void lack() { channel_.mayLack(calls::Side::peer); }
    void finish() {
        channel_.finish();
        findings_.finish(channel_);
    }

  private:
    void accept(std::uint64_t number) {
        fuzz::require(number <= number_ && accepted_.insert(number).second, "a frame is accepted once");
    }

    Checked sink_;
    calls::DChannel channel_;
    calls::LinkFindings findings_{{}, sink_};
    std::set<std::uint64_t> accepted_;
    std::uint64_t number_ = 0;
};

}  // namespace

// A frame is an octet of what happens, one of time, one of length, and its octets.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    fuzz::Input input(data, size);
    Trunk trunk;
    std::int64_t at = 0;
    while (!input.atEnd()) {
        const std::uint8_t what = input.octet();
        at += std::int64_t{input.octet()} * input.octet() * calls::millisecond;
        if (what % 32 == 31)
            trunk.restart();
        else if (what % 32 == 30)
            trunk.lose();
        else if (what % 32 == 29)
            trunk.lack();
        fuzz::Octets octets(input.octet() % 16);
        for (std::uint8_t& octet : octets)
            octet = input.octet();
        trunk.take(octets, (what & 0x80) != 0, at);
    }
    trunk.finish();
    return 0;
}

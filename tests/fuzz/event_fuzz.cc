// The payload of a trace event, from the message that brings it to the text in the log.
#include "app/display.h"
#include "tests/decoder/capture.h"
#include "tests/fuzz/dump.h"
#include "tests/fuzz/payload.h"

namespace {

using Record = vela::CCS::EvtL2Trace_t;

std::string logged(Record& record) {
    decoder::testing::Capture log(decoder::testing::onNet5);
    vela::staticList<unsigned char> octets;
    app::showRecord(record, octets);
    return log.text();
}

std::string endOf(const Record& record) {
    const bool transmitted = record.Direction == 1;
    const int announced = std::max(static_cast<int>(record.Length), 0);
    if (announced > decoder::maximumFrame)
        return (transmitted ? decoder::testing::blanks : "") + "Frame Error \n";
    const vela::staticList<unsigned char>& list = record.List.value();
    const auto shown = std::min(static_cast<unsigned int>(announced), list.length());
    return fuzz::dumpOf(fuzz::Octets(list.begin(), list.begin() + shown), transmitted);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const fuzz::Transport transport;
    const std::unique_ptr<vela::Msg> msg = fuzz::messageOf(fuzz::Octets(data, data + size));
    Record record;
    msg->read(&record, 0);
    const std::string log = logged(record);
    if (record.Label != 2)
        fuzz::require(log.empty(), "what is no frame leaves nothing in the log");
    else
        fuzz::require(log.ends_with(endOf(record)), "the dump ends a frame's text");
    return 0;
}

#include "decoder/time_lines.h"

#include "decoder/lines.h"

namespace decoder {

namespace {

constexpr unsigned int ticksPerSecond = 250;
constexpr unsigned int millisecondsPerTick = 4;

}  // namespace

void timeLines(bool transmitted, unsigned int timestamp, std::string_view localTime) {
    const auto seconds = dec(timestamp / ticksPerSecond);
    const auto milliseconds = dec(timestamp % ticksPerSecond * millisecondsPerTick);
    flag = transmitted ? 0 : 1;
    text("\n");
    output(flag);
    text(localTime);
    output(flag);
    text(transmitted ? "TX" : "RX", " Frame: Time = ", seconds, ".", milliseconds, "\n");
}

std::string_view LocalTime::of(std::time_t second) {
    if (second != shown_ || timezone != shownZone_) {
        if (ctime_r(&second, text_.data()) == nullptr)
            text_ = {"\n"};
        shown_ = second;
        shownZone_ = timezone;  // as ctime_r has found it
    }
    return text_.data();
}

}  // namespace decoder

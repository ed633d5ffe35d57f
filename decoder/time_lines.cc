#include "decoder/time_lines.h"

#include "decoder/lines.h"

namespace decoder {

namespace {

constexpr unsigned int ticksPerSecond = 250;
constexpr unsigned int millisecondsPerTick = 4;
constexpr int secondsAt = 17;  // in "Sat Nov 21 11:25:33 2026"

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
    const bool isOfTheZone = hasDate_ && timezone == shownZone_;
    if (isOfTheZone && second == shown_)
        return text_.data();
    if (!(isOfTheZone && moveTo(second))) {
        hasDate_ = ctime_r(&second, text_.data()) != nullptr;
        if (!hasDate_)
            text_ = {"\n"};
        shownZone_ = timezone;  // as ctime_r has found it
    }
    shown_ = second;
    return text_.data();
}

// No zone has ever changed its offset within half a minute of UTC, and all but a few of the time before 1972
// differ from it by whole half minutes.
bool LocalTime::moveTo(std::time_t second) {
    constexpr std::time_t shared = 30;
    if (second < 0 || shown_ < 0 || second / shared != shown_ / shared)
        return false;
    char* const digits = text_.data() + secondsAt;
    const std::time_t local = (digits[0] - '0') * 10 + (digits[1] - '0') + second - shown_;
    if (local < 0 || local > 59)
        return false;
    digits[0] = static_cast<char>('0' + local / 10);
    digits[1] = static_cast<char>('0' + local % 10);
    return true;
}

}  // namespace decoder

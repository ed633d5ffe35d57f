#include "reader/decode.h"

#include <algorithm>
#include <string>

#include "decoder/cursor.h"
#include "decoder/frame.h"
#include "decoder/lines.h"
#include "decoder/trunks.h"
#include "reader/TextConsumer.h"
#include "reader/errors.h"
#include "reader/session.h"

namespace reader {

namespace {

using Kind = capture::Item::Kind;

// The value of `swit` for a variant, which the decoder's elements ask for.
int switchOf(isdn::Variant variant) {
    switch (variant) {
        case isdn::Variant::ess4:
            return 1;
        case isdn::Variant::ess5:
            return 2;
        case isdn::Variant::dms100:
            return 3;
        case isdn::Variant::ntt:
            return 4;
        case isdn::Variant::ni2:
            return 10;
        case isdn::Variant::net5:
            break;
    }
    return 7;
}

// The board's time stamp, or the time since the first frame if a capture has none.
std::uint32_t ticksOf(const Seen& seen) {
    if (seen.frame().ticks)
        return *seen.frame().ticks;
    return static_cast<std::uint32_t>(std::max<std::int64_t>(seen.sinceFirst, 0) /
                                      capture::nanosecondsPerTick);
}

// The second in which the recorder wrote the frame, or else the second in which it passed.
std::time_t secondOf(const capture::Frame& frame) {
    return frame.written ? *frame.written : frame.time / 1'000'000'000;
}

void composeOctets(capture::Frame const& frame) {
    decoder::RingBuffer cursor;
    std::copy(frame.octets.begin(), frame.octets.end(), cursor.data);
    cursor.count = static_cast<int>(frame.octets.size());
    cursor.writePtr = cursor.data + frame.octets.size();
    decoder::msglen = cursor.count;
    decoder::composeFrame(cursor);
}

void composeOversized() {
    decoder::line("Oversized frame, frame will not be interpreted ");
    decoder::line("Frame Error ");
}

}  // namespace

void LogTextComposer::compose(const Seen& seen, std::string& text, Piece& /*piece*/) {
    const capture::Item& item = *seen.item;
    switch (item.kind) {
        case Kind::frame:
        case Kind::oversized: {
            const bool tooLong = item.frame.octets.size() > decoder::maximumFrame;
            decoder::swit = switchOf(seen.variant);
            decoder::timeLines(item.frame.transmitted, ticksOf(seen), localTime_.of(secondOf(item.frame)));
            if (item.kind == Kind::oversized || tooLong)
                composeOversized();
            else
                composeOctets(item.frame);
            break;
        }
        case Kind::lost:
            decoder::text("Frames Lost: ", decoder::dec(item.count), " \n");
            break;
        case Kind::notQueued:
            decoder::text("Enqueue Failed \n");
            break;
        case Kind::notTaken:
            decoder::text("Get iemsg failed \n");
            break;
        default:
            break;
    }
    text += decoder::lineBuffer.composed();
    decoder::lineBuffer.clear();
}

int runDecode(const Options& options, Chatter& chatter) {
    Session session(options, chatter);
    session.tellGuessedVariant("decoded");
    session.needOnlyOctets();
    TextConsumer consumer(session.output(), TextConsumer::Raw::yes);
    session.run(consumer, [] { return std::make_unique<LogTextComposer>(); });
    return good;
}

}  // namespace reader

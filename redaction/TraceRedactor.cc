#include "redaction/TraceRedactor.h"

#include <algorithm>

namespace redaction {

TraceRedactor::TraceRedactor(const Key& key, Direction direction, const calls::Options& options)
    : pseudonyms_(makePseudonyms(key, direction)),
      redactor_(*pseudonyms_, key.manner.blankShort),
      analysis_(options, redactor_) {}

void TraceRedactor::take(const capture::Frame& frame, std::uint64_t number, isdn::Variant variant,
                         std::vector<Rebuilt>& done) {
    redactor_.expect(number);
    const calls::Marks& marks = analysis_.take(frame, number);
    redactor_.take(frame, marks, variant, done);
    redactor_.giveUpOlderSegments(number - std::min(number, mostWaiting), frame.time - longestWait, done);
}

std::vector<std::uint8_t> TraceRedactor::cut(isdn::Octets frame, isdn::Variant variant) {
    return redactor_.cut(frame, variant);
}

void TraceRedactor::mayMiss(const capture::Interface& interface, std::string_view reason) {
    analysis_.mayMiss(interface, reason);
    redactor_.mayMiss();
}

void TraceRedactor::mayLack(const capture::Interface& interface, calls::Side side) {
    analysis_.mayLack(interface, side);
    redactor_.mayMiss();
}

void TraceRedactor::restarted(const capture::Interface& interface) {
    analysis_.restarted(interface);
    redactor_.mayMiss();
}

}  // namespace redaction

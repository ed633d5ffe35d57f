// The fields of a call: the columns of CSV and the keys of JSON.
#ifndef READER_CALLFIELDS_H
#define READER_CALLFIELDS_H

#include <span>
#include <string>
#include <string_view>

#include "calls/Call.h"
#include "reader/TimeText.h"

namespace reader {

struct CallField {
    enum class Kind { text, number };

    std::string_view key;
    Kind kind;
    // Appends the value, or nothing if the call has none.
    void (*put)(std::string& to, const calls::Call& call, TimeText& times);
};

// In the order of the CSV columns.
std::span<const CallField> callFields();

// The heading line "call,file,dchannel,..." and the line of a call, each with its line end.
std::string callCsvHeader();
void appendCallCsv(std::string& to, const calls::Call& call, TimeText& times);
// Appends one JSON object with the same keys, and with the numbers of the call's frames.
void appendCallJson(std::string& to, const calls::Call& call, TimeText& times);
// Parts that several forms of a call share: the reference "0378"; the direction "U>N", from the side that
// began the call; and a time, which is empty if the frames have none.
void appendReference(std::string& to, const calls::Call& call);
std::string_view directionOf(const calls::Call& call);
void appendInstant(std::string& to, const calls::Moment& moment, TimeText& times);

}  // namespace reader

#endif

// What there is to say of a call, field by field: the columns of CSV and the keys of JSON.
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
    // Appends the value; nothing if the call has none.
    void (*put)(std::string& to, const calls::Call& call, TimeText& times);
};

// In the order of the CSV columns.
std::span<const CallField> callFields();

// "call,file,dchannel,..." and a row, each with its line end.
std::string callCsvHeader();
void appendCallCsv(std::string& to, const calls::Call& call, TimeText& times);
// One object with the same keys, and the numbers of the call's frames.
void appendCallJson(std::string& to, const calls::Call& call, TimeText& times);
// What several forms of a call have in common: "0378", "U>N" (from the side that began it), and a time,
// which is empty where the frames have none.
void appendReference(std::string& to, const calls::Call& call);
std::string_view directionOf(const calls::Call& call);
void appendInstant(std::string& to, const calls::Moment& moment, TimeText& times);

}  // namespace reader

#endif

// The address of a D channel in the fleet, and the subject of its messages.
#ifndef FLEET_SUBJECTS_H
#define FLEET_SUBJECTS_H

#include <compare>
#include <stdexcept>
#include <string>
#include <string_view>

namespace fleet {

// A D channel, unique in the fleet. Names have 1 to 64 characters, all of them printable ASCII.
struct Address {
    std::string site;
    std::string host;
    std::string board;
    std::string dChannel;

    auto operator<=>(const Address&) const = default;
};

bool isName(std::string_view text);

// "london/h1/0/1": the D channel's name in ids, metrics and the store. ASCII letters and digits, "-" and "_"
// stay; any other character is written as "%" and two hexadecimal digits in upper case.
std::string toText(const Address& address);

inline constexpr unsigned partitions = 64;

// Returns the D channel's partition, 0 to 63. All D channels of an NFAS group have one partition. It is
// FNV-1a (64 bits) of "SITE/GROUP", or of the address's text if `group` is empty; the upper and the lower
// half of the hash are combined by XOR, modulo 64. This must never change: one consumer takes all messages of
// a D channel, and so keeps their order.
unsigned partitionOf(const Address& address, std::string_view group);

// Thrown for a subject that no shipper can have made. what() says why.
class BadSubject : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

struct Subject {
    unsigned partition = 0;
    Address address;

    bool operator==(const Subject&) const = default;
};

// "lapd.17.london.h1.0.1", with names written as in an address's text, so that none of them holds a character
// that has a meaning in a subject (".", "*", ">", blanks).
std::string toText(const Subject& subject);
// Reads a subject in exactly the form that toText writes. Throws BadSubject.
Subject subjectIn(std::string_view text);

// All subjects, and those of one partition: "lapd.>", "lapd.17.>".
inline constexpr char everySubject[] = "lapd.>";
std::string subjectsOf(unsigned partition);

// The subject to which a message goes if it cannot be stored: "lapd-dead.17.london.h1.0.1". Takes any subject
// below "lapd.".
inline constexpr char everyDeadSubject[] = "lapd-dead.>";
std::string deadSubjectOf(std::string_view subject);

}  // namespace fleet

#endif

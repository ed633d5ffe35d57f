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

// "london/h1/0/1": what the D channel is called in ids, metrics and the store. Any character of a name that
// is no letter or digit of ASCII, no "-" and no "_" is written as "%" and two hexadecimal digits in upper
// case.
std::string toText(const Address& address);

inline constexpr unsigned partitions = 64;

// 0 to 63. D channels of one NFAS group have one partition; without a group ("") the D channel decides. It is
// FNV-1a, 64 bits, of "SITE/GROUP" or else of the address's text, the upper and the lower half of its bits
// combined by XOR, modulo 64. It must never change: a partition's consumer keeps the order of its trunks.
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

// "lapd.17.london.h1.0.1", its names written as in an address's text. So no name holds what has a meaning in
// a subject (".", "*", ">", blanks).
std::string toText(const Subject& subject);
// Reads a subject in exactly the form that toText writes. Throws BadSubject.
Subject subjectIn(std::string_view text);

// All subjects, and those of one partition: "lapd.>", "lapd.17.>".
inline constexpr char everySubject[] = "lapd.>";
std::string subjectsOf(unsigned partition);

// Where a message goes that cannot be stored: "lapd-dead.17.london.h1.0.1". Takes any subject below "lapd.".
inline constexpr char everyDeadSubject[] = "lapd-dead.>";
std::string deadSubjectOf(std::string_view subject);

}  // namespace fleet

#endif

// The conditions in the rows of tables: they decide whether an octet of an element, or a field, is present.
#ifndef ISDN_WHEN_H
#define ISDN_WHEN_H

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <span>
#include <string_view>

#include "isdn/Variant.h"

namespace isdn {

constexpr std::uint8_t bitsOf(std::uint8_t octet, unsigned high, unsigned low) {
    return static_cast<std::uint8_t>((octet & ((1U << high) - 1U)) >> (low - 1U));
}

// Asks whether bits of an octet have one of some values, all of them below 64. While high is 0, asks nothing.
struct Test {
    std::string_view octet;
    std::uint8_t high = 0;
    std::uint8_t low = 0;
    std::uint64_t values = 0;

    constexpr Test() = default;
    constexpr Test(std::string_view label, unsigned highest, unsigned lowest,
                   std::initializer_list<unsigned> accepted)
        : octet(label), high(static_cast<std::uint8_t>(highest)), low(static_cast<std::uint8_t>(lowest)) {
        for (const unsigned value : accepted)
            values |= std::uint64_t{1} << value;
    }
    constexpr bool given() const { return high != 0; }
    constexpr bool admits(std::uint8_t value) const {
        const unsigned field = bitsOf(value, high, low);
        return field < 64 && (values >> field & 1U) != 0;
    }
};

// Decides whether an octet, or a field, is present.
class When {
  public:
    enum class Presence : std::uint8_t {
        mandatory,  // its absence is a problem
        optional,   // it is there if the element goes on
        extended,   // it is there if bit 8 of the octet before it is clear
    };

    constexpr When() = default;
    constexpr explicit When(Presence given) : presence(given) {}

    Presence presence = Presence::mandatory;
    std::array<Test, 3> seen;  // of octets before it; all must pass
    Test next;                 // of the octet itself
    Variants variants = everywhere;

    // Asks for both. If both conditions say something about `presence` or `next`, that of b counts.
    friend constexpr When operator&(const When& a, const When& b) {
        When both = a;
        if (b.presence != Presence::mandatory)
            both.presence = b.presence;
        for (const Test& test : b.seen) {
            if (test.given())
                both.free() = test;
        }
        if (b.next.given())
            both.next = b.next;
        both.variants.members &= b.variants.members;
        return both;
    }

  private:
    constexpr Test& free() {
        for (Test& test : seen) {
            if (!test.given())
                return test;
        }
        throw "a row asks for three tests at most";
    }
};

inline constexpr When always{};
inline constexpr When optional{When::Presence::optional};
inline constexpr When extended{When::Presence::extended};

// Bits `high` to `low` of the octet of this label have one of these values.
constexpr When ifSeen(std::string_view octet, unsigned high, unsigned low,
                      std::initializer_list<unsigned> values) {
    When when;
    when.seen[0] = {octet, high, low, values};
    return when;
}
// The octet of this label is not 0 in bits 6 to 1.
constexpr When ifNotZero(std::string_view octet) {
    When when = ifSeen(octet, 6, 1, {});
    when.seen[0].values = ~std::uint64_t{1};
    return when;
}
// The octet itself, which is optional, has one of these values in these bits.
constexpr When ifNext(unsigned high, unsigned low, std::initializer_list<unsigned> values) {
    When when = optional;
    when.next = {"", high, low, values};
    return when;
}
constexpr When on(Variants variants) {
    When when;
    when.variants = variants;
    return when;
}

// The octets of an element that have been read, by their labels; the first 24 of them.
class Seen {
  public:
    void add(std::string_view label, std::uint8_t octet) {
        if (count_ < octets_.size())
            octets_[count_++] = {label, octet};
    }
    // The last octet of this label, or null.
    const std::uint8_t* find(std::string_view label) const {
        for (std::size_t i = count_; i-- > 0;) {
            if (octets_[i].label == label)
                return &octets_[i].octet;
        }
        return nullptr;
    }
    bool passes(std::span<const Test> tests) const {
        return std::ranges::all_of(tests, [&](const Test& test) {
            if (!test.given())
                return true;
            const std::uint8_t* const octet = find(test.octet);
            return octet != nullptr && test.admits(*octet);
        });
    }

  private:
    struct Entry {
        std::string_view label;
        std::uint8_t octet;
    };
    std::array<Entry, 24> octets_;
    std::size_t count_ = 0;
};

}  // namespace isdn

#endif

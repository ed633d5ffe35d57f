#include "tests/redaction/Strangers.h"

#include <algorithm>
#include <array>
#include <bit>
#include <random>
#include <utility>

namespace redaction::test {

namespace {

constexpr std::size_t digitsOfNumber = 16;
constexpr std::array codings{Coding::ia5, Coding::ia5WithParity, Coding::bcd, Coding::bcdSwapped,
                             Coding::septets};
constexpr std::string_view names[] = {"IA5", "IA5 with parity", "BCD", "BCD, swapped", "septets"};
constexpr std::size_t octetsOfSix[] = {6, 6, 3, 3, 6};

bool isBlank(std::uint8_t octet) { return octet == 0x00 || octet == 0x80 || octet == 0xFF; }

Bytes coded(const std::array<unsigned, digitsOfNumber>& digits, Coding coding) {
    Bytes octets;
    unsigned bits = 0, held = 0;
    for (std::size_t i = 0; i < digits.size(); ++i) {
        const unsigned character = '0' + digits[i];
        switch (coding) {
            case Coding::ia5:
                octets.push_back(static_cast<std::uint8_t>(character));
                break;
            case Coding::ia5WithParity:
                octets.push_back(
                    static_cast<std::uint8_t>(character | (std::popcount(character) % 2 != 0 ? 0x80U : 0U)));
                break;
            case Coding::bcd:
            case Coding::bcdSwapped: {
                const bool upper = (i % 2 == 0) == (coding == Coding::bcd);
                if (i % 2 == 0)
                    octets.push_back(0);
                octets.back() |= static_cast<std::uint8_t>(upper ? digits[i] << 4U : digits[i]);
                break;
            }
            case Coding::septets:
                bits |= character << held;
                for (held += 7; held >= 8; held -= 8, bits >>= 8U)
                    octets.push_back(static_cast<std::uint8_t>(bits));
                break;
        }
    }
    return octets;
}

class Maker {
  public:
    Maker(unsigned seed, isdn::Variant variant) : random_(seed), variant_(variant) {}

    Stranger run() && {
        const Coding coding = codings[upTo(codings.size() - 1)];
        std::array<unsigned, digitsOfNumber> digits{};
        for (unsigned& digit : digits)
            digit = upTo(9);
        number_ = coded(digits, coding);
        made_.says = std::string(names[static_cast<std::size_t>(coding)]);
        made_.six = octetsOfSix[static_cast<std::size_t>(coding)];
        makeFrame();
        made_.number = number_;
        return std::move(made_);
    }

  private:
    unsigned upTo(std::size_t most) {
        return std::uniform_int_distribution<unsigned>(0, static_cast<unsigned>(most))(random_);
    }
    bool oneIn(unsigned count) { return upTo(count - 1) == 0; }
    std::uint8_t any(std::initializer_list<unsigned> values) {
        return static_cast<std::uint8_t>(values.begin()[upTo(values.size() - 1)]);
    }
    void say(std::string_view words) { made_.says.append(", ").append(words); }

    static Bytes join(std::initializer_list<Bytes> parts) {
        Bytes all;
        for (const Bytes& part : parts)
            all.insert(all.end(), part.begin(), part.end());
        return all;
    }
    // The length is wrong now and then. One that is too short leaves digits where elements begin; two digits
    // of four bits may be the identifier of one and its length.
    Bytes withLength(Bytes head, const Bytes& contents) {
        std::size_t length = contents.size();
        if (oneIn(12)) {
            if (isDense())
                length = std::min<std::size_t>(contents.size() + 1 + upTo(40), 255);
            else
                length = upTo(3) == 0 ? upTo(255) : upTo(contents.size() + 2);
            say("length " + std::to_string(length) + " for " + std::to_string(contents.size()));
        }
        head.push_back(static_cast<std::uint8_t>(length));
        return join({head, contents});
    }

    void makeFrame() {
        using Make = Bytes (Maker::*)();
        static constexpr Make kinds[] = {&Maker::message,  &Maker::message, &Maker::message,
                                         &Maker::message,  &Maker::message, &Maker::strangeMessage,
                                         &Maker::linkFrame};
        made_.octets = (this->*kinds[upTo(std::size(kinds) - 1)])();
        if (oneIn(10)) {
            made_.octets.resize(upTo(made_.octets.size()));
            say("cut");
        }
    }

    Bytes linkFrame() {
        const Bytes heads[] = {{0x42, 0x01, 0x03},
                               {0x02, 0x01, 0x97, 0x00, 0x00, 0x01},
                               {0x00, 0x01, 0xAF, 0x82, 0x80, 0x00, static_cast<std::uint8_t>(upTo(20)),
                                static_cast<std::uint8_t>(upTo(12)), static_cast<std::uint8_t>(upTo(16))},
                               {0xFE, 0xFF, 0x03, 0x0F, 0x12, 0x34, static_cast<std::uint8_t>(upTo(8))},
                               {0xFE, 0xFF, 0x03, static_cast<std::uint8_t>(upTo(255))},
                               {0x00, 0x01, 0x01, 0x02},
                               {0x00, 0x01, 0x73},
                               {0x02, 0x01, 0x00, 0x00, static_cast<std::uint8_t>(upTo(255))}};
        const unsigned kind = upTo(std::size(heads) - 1);
        say("frame " + std::to_string(kind));
        return join({heads[kind], number_});
    }
    Bytes strangeMessage() {
        const unsigned kind = upTo(isDense() ? 1 : 2);
        say("header " + std::to_string(kind));
        const Bytes link = {0x00, 0x01, 0x00, 0x00};
        if (kind == 0)  // a long call reference
            return join({link,
                         {0x08, static_cast<std::uint8_t>(isDense() ? 3 + upTo(12) : upTo(15))},
                         number_,
                         {0x05},
                         channel()});
        if (kind == 1)
            return join({link, {0x08, 0x01, 0x01, 0x60, 0x00, 0x02, 0x81, 0x05}, number_});
        return join({link, {any({0x03, 0x43, 0x08}), 0x02, 0x00, 0x01, 0x00}, number_});
    }

    static Bytes bearer() { return {0x04, 0x03, 0x80, 0x90, 0xA3}; }
    static Bytes channel() { return {0x18, 0x03, 0xA9, 0x83, 0x81}; }
    static Bytes progress() { return {0x1E, 0x02, 0x82, 0x88}; }

    Bytes message() {
        Bytes octets = {
            0x00,
            0x01,
            0x00,
            0x00,
            any({0x08, 0x08, 0x08, 0x03, 0x43}),
            0x02,
            0x00,
            0x01,
            any({0x05, 0x01, 0x03, 0x07, 0x0F, 0x20, 0x45, 0x4D, 0x5A, 0x62, 0x64, 0x7B, 0x7D, 0x33})};
        if (oneIn(2))
            octets = join({octets, bearer(), channel()});
        octets = join({octets, strange()});
        return oneIn(2) ? join({octets, progress(), {0x7D, 0x02, 0x91, 0x81}}) : octets;
    }

    Bytes strange() {
        using Make = Bytes (Maker::*)();
        static constexpr Make kinds[] = {&Maker::anyElement, &Maker::anyElement, &Maker::party,
                                         &Maker::causeOf,    &Maker::facility,   &Maker::facility,
                                         &Maker::facility,   &Maker::network};
        return (this->*kinds[upTo(std::size(kinds) - 1)])();
    }

    // Elements that consist of codes may hold any octets, and two digits of four bits are one: there, a
    // number that is coded so cannot be told from the codes of the standard.
    bool isDense() const { return made_.six == 3 || made_.says.starts_with("septets"); }

    Bytes anyElement() {
        std::uint8_t id = static_cast<std::uint8_t>(upTo(0x7F));
        Bytes shift;
        if (oneIn(3))
            shift = {static_cast<std::uint8_t>(0x90 + upTo(15))};
        constexpr std::uint8_t ofCodes[] = {0x00, 0x01, 0x03, 0x04, 0x14, 0x18, 0x1E, 0x24, 0x27, 0x29,
                                            0x32, 0x34, 0x38, 0x39, 0x3B, 0x40, 0x42, 0x43, 0x44, 0x45,
                                            0x46, 0x4A, 0x75, 0x79, 0x7B, 0x7C, 0x7D, 0x31};
        if (isDense() && std::ranges::find(ofCodes, id) != std::end(ofCodes))
            id = 0x6C;
        say("element " + std::to_string(id) + (shift.empty() ? "" : " behind a shift"));
        const Bytes heads[] = {{},           {0x80},       {0x80, 0x90},      {0x21},
                               {0x21, 0x80}, {0xA9, 0x83}, {0x88, 0x90, 0x21}};
        const Bytes head = isDense() ? heads[1 + upTo(1)] : heads[upTo(std::size(heads) - 1)];
        return join({shift, withLength({id}, join({head, number_}))});
    }
    Bytes party() {
        const std::uint8_t id = any({0x70, 0x6C, 0x4C, 0x74, 0x73, 0x71, 0x6D, 0x28, 0x2C, 0x7E});
        say("party " + std::to_string(id));
        return withLength({id},
                          join({{isDense() ? any({0x81, 0xA1}) : any({0x81, 0xA1, 0x21, 0x00})}, number_}));
    }
    Bytes causeOf() {
        const auto value = static_cast<std::uint8_t>(0x80 + upTo(127));
        say("cause " + std::to_string(value & 0x7FU));
        const Bytes more = oneIn(2) ? Bytes{} : Bytes{any({0x80, 0xA0, 0x01, 0x84})};
        return withLength({0x08}, join({{any({0x82, 0x82, 0x02, 0xE2})}, {value}, more, number_}));
    }
    // Where networks are named, by their codes.
    Bytes network() {
        say("network");
        if (oneIn(2))
            return withLength({0x78}, join({{0xA1}, number_}));
        const auto length = static_cast<std::uint8_t>(upTo(20));
        return withLength({0x20}, join({{length, 0xA1}, number_, {0x81}}));
    }

    // A value of basic encoding rules, its identifier and length in one of the forms that are possible.
    Bytes value(std::uint8_t tag, const Bytes& contents) {
        Bytes head = {tag};
        if (oneIn(15)) {
            say("long tag");
            head = {static_cast<std::uint8_t>(tag | 0x1FU), 0x81, 0x02};
        }
        if (oneIn(15)) {
            say("long length");
            head.insert(head.end(), {0x82, 0x00});
        }
        return withLength(head, contents);
    }
    Bytes integer(unsigned number) { return value(0x02, {static_cast<std::uint8_t>(number)}); }

    Bytes facility() {
        static constexpr std::uint8_t operations[] = {0x00, 0x07, 0x0F, 0x21, 0x22, 0x23, 0x24, 0x63, 0x15};
        const std::uint8_t operation = operations[upTo(std::size(operations) - 1)];
        const unsigned place = upTo(8);
        say("facility " + std::to_string(place) + " of operation " + std::to_string(operation));
        const Bytes profile = oneIn(3) ? Bytes{0x9F} : Bytes{0x91};
        const auto component = [&](const Bytes& contents) {
            return value(any({0xA1, 0xA1, 0xA2, 0xA3, 0xA4}), contents);
        };
        const auto whole = [&](const Bytes& values) {
            return withLength({any({0x1C, 0x1C, 0x0D})}, join({profile, values}));
        };
        switch (place) {
            case 0:  // the invoke identifier
                return whole(component(join({value(0x02, number_), integer(operation)})));
            case 1:  // the operation, or the error
                return whole(component(join({integer(1), value(any({0x02, 0x06}), number_)})));
            case 2:  // the linked identifier
                return whole(component(join({integer(1), value(0x80, number_), integer(operation)})));
            case 3:  // an argument that is no sequence
                return whole(component(join({integer(1), integer(operation), strangeValue()})));
            case 4:  // beside the components
                return whole(
                    join({value(any({0x80, 0x92, 0xAA, 0x8B, 0x8C}), number_), component(integer(1))}));
            case 5:  // in the length of a value, which is longer than the element
                return whole(component(join({{0x02, 0x88}, number_})));
            case 6:  // in the identifier of a value
                return whole(component(join({{0x3F, 0x81}, number_, {0x01, 0x01}})));
            default:
                return whole(component(
                    join({integer(1), integer(operation), value(0x30, join({integer(2), strangeValue()}))})));
        }
    }
    Bytes strangeValue() {
        const std::uint8_t tag = any({0x01, 0x02, 0x03, 0x04, 0x05, 0x06, 0x0A, 0x0C, 0x12, 0x16, 0x17, 0x80,
                                      0x81, 0x82, 0x83, 0x84, 0x41, 0xC5});
        say("tag " + std::to_string(tag));
        const Bytes inner = value(tag, number_);
        return oneIn(3) ? value(any({0xA0, 0xA1, 0xA2, 0x30}), inner) : inner;
    }

    std::mt19937 random_;
    isdn::Variant variant_;
    Bytes number_;
    Stranger made_;
};

}  // namespace

Stranger strangerOf(unsigned seed, isdn::Variant variant) { return Maker(seed, variant).run(); }

std::string sixDigitsIn(const Stranger& stranger, const Bytes& octets) {
    for (std::size_t i = 0; i + stranger.six <= stranger.number.size(); ++i) {
        const Bytes six(stranger.number.begin() + static_cast<std::ptrdiff_t>(i),
                        stranger.number.begin() + static_cast<std::ptrdiff_t>(i + stranger.six));
        // Blanks may be what was there before.
        const bool tells = std::ranges::none_of(six, [](std::uint8_t octet) { return isBlank(octet); }) &&
                           std::ranges::any_of(six, [](std::uint8_t octet) { return octet != '0'; });
        if (tells && std::search(octets.begin(), octets.end(), six.begin(), six.end()) != octets.end())
            return textOf(six);
    }
    return {};
}

}  // namespace redaction::test

#include <algorithm>
#include <utility>

#include "tests/redaction/people.h"

namespace redaction::test {

namespace {

using calls::Side;
using calls::test::CallScript;
namespace type = isdn::message;

class Maker {
  public:
    Maker(unsigned structure, unsigned content, isdn::Variant variant)
        : structure_(structure), content_(content), variant_(variant) {}

    People run() && {
        constexpr unsigned calls = 12;
        for (std::uint16_t reference = 1; reference <= calls; ++reference)
            makeCall(reference);
        for (const Passed& passed : passedIn(script_))
            made_.frames.push_back(passed);
        addStrangers();
        return std::move(made_);
    }

  private:
    using Element = Bytes (Maker::*)();

    unsigned upTo(unsigned most) { return std::uniform_int_distribution<unsigned>(0, most)(structure_); }
    unsigned anyOf(unsigned count) { return std::uniform_int_distribution<unsigned>(0, count - 1)(content_); }

    Bytes secretOf(std::string_view alphabet, unsigned size) {
        std::string text;
        for (unsigned i = 0; i < size; ++i)
            text += alphabet[anyOf(static_cast<unsigned>(alphabet.size()))];
        made_.secrets.push_back(text);
        return {text.begin(), text.end()};
    }
    Bytes number() { return secretOf("0123456789", 6 + upTo(7)); }
    Bytes name() { return secretOf("ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz", 5 + upTo(9)); }
    Bytes user() { return upTo(1) == 0 ? number() : name(); }

    static Bytes join(std::initializer_list<Bytes> parts) {
        Bytes all;
        for (const Bytes& part : parts)
            all.insert(all.end(), part.begin(), part.end());
        return all;
    }
    static Bytes withLength(Bytes head, const Bytes& contents) {
        head.push_back(static_cast<std::uint8_t>(contents.size()));
        return join({head, contents});
    }

    Bytes party() {
        constexpr std::uint8_t ids[] = {0x6C, 0x4C, 0x0C, 0x74, 0x76, 0x73};
        const std::uint8_t id = ids[upTo(5)];
        return withLength({id}, join({{static_cast<std::uint8_t>(upTo(0x7F)), 0x80}, number()}));
    }
    Bytes subaddress() {
        const std::uint8_t id = upTo(1) == 0 ? 0x71 : 0x6D;
        return upTo(1) == 0 ? withLength({id}, join({{0xA0}, user()}))
                            : withLength({id}, join({{0x80, 0x50}, user()}));
    }
    Bytes display() {
        if (upTo(2) == 0)
            return withLength({0x28}, name());
        if (upTo(1) == 0)
            return withLength({0x28}, join({{0xB1}, name()}));
        return withLength({0x28}, join({{0x80}, withLength({0x8D}, name()), withLength({0x8B}, number())}));
    }
    Bytes brokenDisplay() { return withLength({0x28}, join({{0x80, 0x8D, 0x7F}, name()})); }
    Bytes userUser() {
        return withLength({0x7E}, join({{static_cast<std::uint8_t>(upTo(1) == 0 ? 4 : 0)}, user()}));
    }
    Bytes identity() { return withLength({0x10}, number()); }
    Bytes profile() { return withLength({0x3A}, number()); }
    Bytes cause() {
        const Bytes heads[] = {{0x82, 0x96}, {0x82, 0x90}, {0x82, 0x95, 0x80}};
        return withLength({0x08}, join({heads[upTo(2)], number()}));
    }
    Bytes causeOfOthers() { return withLength({0x08}, join({{0xE2, 0x81}, number()})); }
    Bytes networkFacilities() { return withLength({0x20}, join({{0x00, 0xA1}, user()})); }
    Bytes genericDigits() { return withLength({0x9E, 0x37}, join({{0x01}, number()})); }
    Bytes unknown() {
        const auto shift = static_cast<std::uint8_t>(0x9C + upTo(3));
        return withLength({shift, static_cast<std::uint8_t>(0x60 + upTo(15))}, user());
    }
    Bytes unknownInCodeset0() { return withLength({0x5E}, user()); }
    Bytes tooLong() { return withLength({0x1E}, join({{0x82, 0x88}, user()})); }
    Bytes notification() { return withLength({0x27}, join({{0x84}, user()})); }
    Bytes diversion() {
        const Bytes digits = withLength({0x12}, number());
        const Bytes publicNumber = withLength({0xA1}, join({{0x0A, 0x01, 0x02}, digits}));
        const Bytes presented = withLength({0xA1}, withLength({0xA0}, publicNumber));
        const Bytes argument = withLength({0x30}, join({{0x02, 0x01, 0x01, 0x0A, 0x01, 0x02}, presented}));
        return facility({0x91}, 0x0F, argument);
    }
    Bytes unknownOperation() {
        constexpr std::uint8_t tags[] = {0x04, 0x12, 0x16, 0x0C, 0x80, 0x85, 0x40};
        return facility({0x91}, 0x63, withLength({0x30}, withLength({tags[upTo(6)]}, user())));
    }
    Bytes nameOfPrivate() { return facility({0x9F, 0x8B, 0x01, 0x00}, 0x00, withLength({0x80}, name())); }
    Bytes brokenFacility() { return withLength({0x1C}, join({{0x91, 0xA1, 0x7F}, user()})); }
    Bytes strangeFacility() { return withLength({0x1C}, join({{0x95}, user()})); }
    static Bytes facility(Bytes head, std::uint8_t operation, const Bytes& argument) {
        const Bytes component =
            withLength({0xA1}, join({{0x02, 0x01, 0x01, 0x02, 0x01, operation}, argument}));
        return withLength({0x1C}, join({head, component}));
    }

    Bytes anything() {
        static constexpr Element elements[] = {
            &Maker::party,           &Maker::party,          &Maker::party,
            &Maker::subaddress,      &Maker::display,        &Maker::brokenDisplay,
            &Maker::userUser,        &Maker::identity,       &Maker::profile,
            &Maker::cause,           &Maker::causeOfOthers,  &Maker::networkFacilities,
            &Maker::genericDigits,   &Maker::unknown,        &Maker::unknownInCodeset0,
            &Maker::tooLong,         &Maker::notification,   &Maker::diversion,
            &Maker::nameOfPrivate,   &Maker::brokenFacility, &Maker::strangeFacility,
            &Maker::unknownOperation};
        return (this->*elements[upTo(std::size(elements) - 1)])();
    }
    Bytes elements() {
        Bytes all;
        for (unsigned left = upTo(4); left > 0; --left)
            all = join({all, anything()});
        if (upTo(5) == 0)  // an element that the message ends in
            all = join({all, {0x6C, 0x7F, 0x80}, number()});
        return all;
    }
    static Bytes called(const Bytes& digits) { return withLength({0x70}, join({{0x81}, digits})); }

    // The number comes in one piece, or digit by digit.
    void makeCall(std::uint16_t reference) {
        static constexpr std::uint8_t types[] = {type::alerting,   type::connect, type::progress,
                                                 type::facility,   type::notify,  type::userInformation,
                                                 type::disconnect, type::release};
        const Bytes digits = number();
        const std::size_t first = upTo(2) == 0 ? upTo(3) : digits.size();
        const Side origin = upTo(1) == 0 ? Side::us : Side::peer;
        const bool inSegments = upTo(4) == 0;
        const Bytes setup =
            join({calls::test::bearerSpeech(),
                  called({digits.begin(), digits.begin() + static_cast<std::ptrdiff_t>(first)}), elements()});
        if (inSegments)
            makeSegments(origin, reference, setup);
        else if (upTo(9) != 0)  // else the call began before the trace
            script_.message(origin, type::setup, reference, false, {setup});
        for (std::size_t i = first; i < digits.size(); ++i)
            script_.message(origin, type::information, reference, false, {called({digits[i]})});
        for (unsigned left = upTo(5); left > 0; --left)
            script_.message(upTo(1) == 0 ? origin : other(origin), types[upTo(7)], reference, false,
                            {elements()});
    }
    void makeSegments(Side origin, std::uint16_t reference, const Bytes& setup) {
        const std::size_t cut = std::min<std::size_t>(upTo(40), setup.size());
        const auto at = setup.begin() + static_cast<std::ptrdiff_t>(cut);
        script_.message(origin, type::segment, reference, false,
                        {join({{0x00, 0x02, 0x81, type::setup}, {setup.begin(), at}})});
        if (upTo(4) != 0)
            script_.message(origin, type::segment, reference, false,
                            {join({{0x00, 0x02, 0x00, type::setup}, {at, setup.end()}})});
    }

    // Frames that are no messages of call control.
    void addStrangers() {
        const std::initializer_list<Bytes> heads = {{0x42, 0x01, 0x03},              // SAPI 16
                                                    {0x00, 0x01, 0xAF, 0x82, 0xFF},  // XID
                                                    {0x02, 0x01, 0x03, 0x41},        // another protocol
                                                    {0x02, 0x01, 0x03, 0x08, 0x30},  // a wrong reference
                                                    {0xFE, 0xFF, 0x03, 0x0F, 0x12, 0x34, 0x02, 0x87},  // TEI
                                                    {0x00, 0x00, 0x03, 0x08, 0x01, 0x01, 0x05, 0x28}};
        for (const Bytes& head : heads)
            made_.frames.push_back({join({head, user()}), upTo(1) == 0});
    }

    std::mt19937 structure_;
    std::mt19937 content_;
    isdn::Variant variant_;
    CallScript script_;
    People made_;
};

}  // namespace

People peopleOf(unsigned structure, unsigned content, isdn::Variant variant) {
    return Maker(structure, content, variant).run();
}

}  // namespace redaction::test

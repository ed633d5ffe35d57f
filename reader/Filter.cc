#include "reader/Filter.h"

#include <algorithm>
#include <optional>

#include "isdn/values.h"
#include "reader/CallFilter.h"
#include "reader/FilterGroups.h"
#include "reader/errors.h"
#include "reader/text.h"

namespace reader {

namespace {

template <class Predicate>
class OnFrame : public Condition {
  public:
    explicit OnFrame(Predicate predicate) : predicate_(std::move(predicate)) {}
    bool holds(const Seen& seen) const override { return predicate_(seen); }

  private:
    Predicate predicate_;
};

template <class Predicate>
std::unique_ptr<Condition> onFrame(Predicate predicate) {
    return std::make_unique<OnFrame<Predicate>>(std::move(predicate));
}

// A condition on the elements of one codeset-0 identifier; it holds if it holds for any of them.
template <class Predicate>
std::unique_ptr<Condition> onElements(Predicate predicate) {
    return onFrame([predicate](const Seen& seen) {
        return seen.hasMessage && std::ranges::any_of(seen.message.elements, predicate);
    });
}

class OnTime : public Condition {
  public:
    OnTime(const std::string& value, bool from) : point_(value), from_(from) {}

    void begin(Instant first) override { bound_ = point_.on(first); }
    bool holds(const Seen& seen) const override {
        if (seen.when.clock == capture::Clock::none || !bound_)
            return false;
        return from_ ? seen.when.time >= *bound_ : seen.when.time < *bound_;
    }
    bool isAboutTime() const override { return true; }

  private:
    TimePoint point_;
    bool from_;
    std::optional<std::int64_t> bound_;
};

[[noreturn]] void refuse(std::string_view option, const std::string& value, std::string_view form) {
    throw UsageError("--" + std::string(option) + " takes " + std::string(form) + ", not " + value);
}

unsigned numberFor(std::string_view option, const std::string& value, unsigned most) {
    unsigned number = 0;
    if (!readNumber(std::string_view(value), number) || number > most)
        refuse(option, value, "a number up to " + std::to_string(most));
    return number;
}

std::unique_ptr<Condition> byCallReference(const std::string& value) {
    std::string_view digits = value;
    std::optional<bool> flag;
    if (digits.starts_with("0x"))
        digits.remove_prefix(2);
    // Accepts "0378o" and "0378d", as a list shows them. A final "d" counts as the direction only if the
    // number of characters is odd, because it may be a digit.
    if (digits.size() % 2 == 1 && (digits.ends_with('o') || digits.ends_with('d'))) {
        flag = digits.ends_with('d');
        digits.remove_suffix(1);
    }
    std::uint64_t reference = 0;
    if (!readNumber(digits, reference, 16))
        refuse("callref", value, "hexadecimal digits as a line shows them, 0378 or 0378o");
    return onFrame([reference, flag](const Seen& seen) {
        const isdn::CallReference& shown = seen.message.callReference;
        return seen.hasMessage && seen.message.hasCallReference && shown.value == reference &&
               (!flag || shown.flag == *flag);
    });
}

std::unique_ptr<Condition> byMessage(const std::string& value) {
    const std::string name = plainName(value);
    unsigned code = 0;
    const bool isCode = value.starts_with("0x") && readNumber(std::string_view(value).substr(2), code, 16);
    bool known = isCode;
    for (const std::uint8_t discriminator : {isdn::callControl, isdn::maintenance}) {
        for (unsigned type = 0; type < 256 && !known; ++type)
            known = plainName(isdn::messageName(discriminator, static_cast<std::uint8_t>(type))) == name;
    }
    if (!known || name.empty())
        refuse("message", value, "the name of a message, or its code as 0x05");
    return onFrame([name, code, isCode](const Seen& seen) {
        if (!seen.hasMessage || !seen.message.hasType)
            return false;
        return isCode ? seen.message.type == code : plainName(isdn::messageName(seen.message)) == name;
    });
}

bool isPartyNumber(std::uint8_t id) {
    using namespace isdn::element;
    return id == callingNumber || id == calledNumber || id == connectedNumber || id == redirectingNumber ||
           id == redirectionNumber || id == originalCalledNumber;
}

std::unique_ptr<Condition> byNumber(const std::string& value) {
    if (value.empty() || value.find_first_not_of("0123456789*#ABCDabcd+") != std::string::npos)
        refuse("number", value, "digits");
    return onElements([value](const isdn::Element& element) {
        if (element.codeset != 0)
            return false;
        if (element.id == isdn::element::keypad)
            return isdn::keypadDigits(element).find(value) != std::string_view::npos;
        if (!isPartyNumber(element.id))
            return false;
        const auto number = isdn::partyNumber(element);
        return number && number->digits.find(value) != std::string_view::npos;
    });
}

std::unique_ptr<Condition> byCause(const std::string& value) {
    const bool any = value == "any";
    const unsigned cause = any ? 0 : numberFor("cause", value, 127);
    return onElements([any, cause](const isdn::Element& element) {
        if (element.codeset != 0 || element.id != isdn::element::cause)
            return false;
        const auto shown = isdn::cause(element);
        return shown && (any || shown->value == cause);
    });
}

std::unique_ptr<Condition> byChannel(const std::string& value) {
    std::string_view number = value;
    std::optional<unsigned> interface;
    if (const std::size_t slash = number.find('/'); slash != std::string_view::npos) {
        interface = numberFor("channel", value.substr(0, slash), 0x7FFFFFFF);
        number.remove_prefix(slash + 1);
    }
    const unsigned channel = numberFor("channel", std::string(number), 127);
    return onElements([channel, interface](const isdn::Element& element) {
        if (element.codeset != 0 || element.id != isdn::element::channelIdentification)
            return false;
        const auto shown = isdn::channelId(element);
        return shown && !shown->dChannel && shown->channels.test(channel) &&
               (!interface || shown->interface == interface);
    });
}

std::unique_ptr<Condition> byFrameType(const std::string& value) {
    const std::string name = plainName(value);
    for (unsigned type = 0; type <= static_cast<unsigned>(isdn::FrameType::UNKNOWN); ++type) {
        const auto wanted = static_cast<isdn::FrameType>(type);
        if (plainName(isdn::nameOf(wanted)) == name)
            return onFrame([wanted](const Seen& seen) { return seen.link.type == wanted; });
    }
    refuse("type", value, "a type of frame: I, RR, SABME, ...");
}

std::unique_ptr<Condition> byMark(const std::string& value) {
    const std::string name = plainName(value);
    std::vector<MarkRow> wanted;
    std::string known = "any";
    for (const MarkRow& row : markRows()) {
        (known += ", ") += row.word;
        if (name == "any" || plainName(row.word).find(name) != std::string::npos)
            wanted.push_back(row);
    }
    if (name.empty() || wanted.empty())
        refuse("mark", value, "a mark or a part of it (" + known + ")");
    return onFrame([wanted](const Seen& seen) {
        return std::ranges::any_of(wanted, [&](const MarkRow& row) { return row.holds(seen); });
    });
}

std::unique_ptr<Condition> byTei(const std::string& value) {
    const unsigned tei = numberFor("tei", value, 127);
    return onFrame([tei](const Seen& seen) { return seen.link.tei == tei; });
}

std::unique_ptr<Condition> byLayer(const std::string& value) {
    if (value != "2" && value != "3")
        refuse("layer", value, "2 or 3");
    return onFrame([wanted = value == "3"](const Seen& seen) { return seen.hasMessage == wanted; });
}

std::unique_ptr<Condition> noKeepAlive(const std::string& /*value*/) {
    return onFrame([](const Seen& seen) { return !seen.keepAlive; });
}

std::unique_ptr<Condition> since(const std::string& value) { return std::make_unique<OnTime>(value, true); }
std::unique_ptr<Condition> until(const std::string& value) { return std::make_unique<OnTime>(value, false); }

// clang-format off
constexpr FilterRow rows[] = {
    {"callref", "REF",      "Frames of this call reference, as a line shows it: 0378, or 0378o for one direction", byCallReference},
    {"message", "NAME",     "Frames of this message: SETUP, release-complete, or its code 0x05", byMessage},
    {"number",  "DIGITS",   "Frames with a party number or keypad text that holds these digits", byNumber},
    {"cause",   "N",        "Frames with this cause value; any: with any cause", byCause},
    {"channel", "N",        "Frames that name this B channel; 0/30 names the interface as well", byChannel},
    {"tei",     "N",        "Frames of this terminal endpoint", byTei},
    {"type",    "TYPE",     "Frames of this type: I, RR, SABME, UA, DISC, DM, FRMR, ...", byFrameType},
    {"mark",    "WORDS",    "Frames with this mark, such as retransmitted; any: with any mark", byMark},
    {"layer",   "2|3",      "3: frames that carry a message; 2: all others", byLayer},
    {"no-keepalive", "",    "No polls, and answers to them, that only say that nothing has happened", noKeepAlive},
    {"since",   "TIME",     "From this time on: 2026-11-21T11:25:33+01:00, 2026-11-21, 11:25 or +12.5 (after the first frame)", since},
    {"until",   "TIME",     "Before this time", until},
    {"call",    "N",        "Frames of this call, by the number that `lapdread calls` prints", nullptr, byCallNumber},
    {"failed",  "",         "Frames of calls that failed, or ended in an unusual way", nullptr, byFailure},
    {"unanswered", "",      "Frames of calls that nobody answered", nullptr, byNoAnswer},
};
// clang-format on

}  // namespace

std::span<const FilterRow> filterRows() { return rows; }

const FilterRow& filterRowNamed(std::string_view name) {
    return *std::find_if(std::begin(rows), std::end(rows),
                         [&](const FilterRow& row) { return row.name == name; });
}

Filter::Filter(const std::vector<FilterWord>& words)
    : groups_(groupsOf(std::span(words), &FilterRow::make)),
      hidesKeepAlives_(std::ranges::any_of(
          words, [](const FilterWord& word) { return filterRowNamed(word.name).make == noKeepAlive; })) {}

Filter::~Filter() = default;
Filter::Filter(Filter&& other) noexcept = default;
Filter& Filter::operator=(Filter&& other) noexcept = default;

bool Filter::isEmpty() const { return groups_.empty(); }

void Filter::begin(Instant firstFrame) {
    for (const FilterGroup<Condition>& group : groups_) {
        for (const auto& condition : group.anyOf)
            condition->begin(firstFrame);
    }
}

bool Filter::passes(const Seen& seen) const {
    return std::all_of(groups_.begin(), groups_.end(), [&](const FilterGroup<Condition>& group) {
        const auto holds = [&](const std::unique_ptr<Condition>& condition) {
            return (seen.isFrame() || condition->isAboutTime()) && condition->holds(seen);
        };
        return std::any_of(group.anyOf.begin(), group.anyOf.end(), holds) != group.negated;
    });
}

}  // namespace reader

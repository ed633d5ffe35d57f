#include <algorithm>
#include <string>
#include <utility>
#include <vector>

#include "lapdlog/BoardClock.h"
#include "lapdlog/HostTime.h"
#include "lapdlog/Prover.h"
#include "lapdlog/between.h"
#include "lapdlog/guessing.h"
#include "lapdlog/headers.h"
#include "lapdlog/line_ends.h"
#include "lapdlog/log.h"
#include "lapdlog/variants.h"

namespace lapdlog {

namespace {

using capture::Item;
using capture::Reader;
using capture::Source;
using capture::Variant;
using Kind = Item::Kind;

// How much text is looked at, if it is there, to find out the variant of a log without a head.
constexpr std::size_t guessedFrom = std::size_t{1} << 18;
constexpr std::size_t longestLine = std::size_t{1} << 20;

class LogParser final : public capture::Parser {
  public:
    explicit LogParser(const capture::Context& context)
        : source_(context.source),
          interfaces_(context.interfaces),
          interface_(context.unnamed),
          isChosen_(context.options.variant != Variant::unknown) {}

    Reader::Next next(Item& item) override;

  private:
    // What was found at the beginning of the window. The size of an item is in found_.
    enum class Found : std::uint8_t {
        item,
        more,  // more text could make an item of it
        nothing,
        end
    };

    Found look(Item& item);
    Found find(std::string_view text, bool isAll, Item& item);
    Found findFrame(std::string_view text, const Header& header, bool isAll, Item& item);
    Found findBetween(std::string_view text, bool isAll, Item& item);
    Found guess(std::string_view text, bool isAll);
    Prover::Proof prove(std::string_view text, const Header& header, bool isAll);
    std::size_t untitledFrom(std::size_t at) const;
    void setFrame(const Prover::Proof& proof, const Header& header, std::int64_t host, Item& item);

    Item itemOf(Kind kind, std::string_view text = {}) const;
    void use(Variant variant) { interface_ = interfaces_.of({interface_->name, variant}); }
    Reader::Next deliver(Item& item);
    void consume(std::size_t octets);
    bool passLine();
    Item takePassed(bool isEnd);

    Source& source_;
    capture::Interfaces& interfaces_;
    const capture::Interface* interface_;
    bool isChosen_;  // the user has chosen the variant
    HostTime hostTime_;
    BoardClock clock_;
    Prover prover_;
    std::uint64_t line_ = 1;      // of the window's beginning
    std::uint64_t position_ = 0;  // of the window's beginning, in octets
    std::uint64_t untitled_ = 0;  // no title of a dump begins between the window's beginning and this place
    std::size_t found_ = 0;
    std::size_t toConsume_ = 0;
    bool isDoubtful_ = false;   // the frame found last would be another one if its dump went on
    std::vector<Item> before_;  // items that come before a frame, and then the frame itself
    std::size_t shown_ = 0;
    std::string text_;
    bool saidMixed_ = false;

    bool isUnproved_ = false;  // find() has found time lines, and no proof
    Item unproved_;
    // The number of lines before the window that prove nothing, and the text of the first.
    std::uint64_t passedLines_ = 0;
    bool passesFrame_ = false;
    Item passed_;
    std::vector<std::uint8_t> passedOctets_;
};

Reader::Next LogParser::next(Item& item) {
    if (shown_ < before_.size()) {
        item = before_[shown_++];
        return Reader::Next::item;
    }
    before_.clear();
    shown_ = 0;
    consume(std::exchange(toConsume_, 0));
    while (true) {
        const Found found = look(item);
        if (found == Found::item)
            return deliver(item);
        const bool goesOn = found == Found::nothing && !(isUnproved_ && passedLines_ > 0) && passLine();
        if (goesOn)
            continue;
        if (passedLines_ == 0)
            return found == Found::end ? Reader::Next::end : Reader::Next::pause;
        item = takePassed(found == Found::end);
        return Reader::Next::item;
    }
}

LogParser::Found LogParser::look(Item& item) {
    Source::State state = source_.want(interface_->variant == Variant::unknown ? guessedFrom : 1);
    while (true) {
        const std::string_view text = source_.held();
        if (text.empty())
            return state == Source::State::end ? Found::end : Found::more;
        const Found found = find(text, state == Source::State::end, item);
        if (found != Found::more || state == Source::State::end)
            return found == Found::more ? Found::nothing : found;
        state = source_.want(text.size() + 1);
        if (state == Source::State::pause)
            return isDoubtful_ ? find(source_.held(), true, item) : Found::more;
    }
}

LogParser::Found LogParser::find(std::string_view text, bool isAll, Item& item) {
    isUnproved_ = isDoubtful_ = false;
    before_.clear();
    Header header;
    const Reading read = readHeader(text, header);
    if (read == Reading::good)
        return findFrame(text.substr(header.size), header, isAll, item);
    const Found between = findBetween(text, isAll, item);
    return between == Found::nothing && read == Reading::cut ? Found::more : between;
}

LogParser::Found LogParser::findBetween(std::string_view text, bool isAll, Item& item) {
    Between between;
    const Reading read = readBetween(text, isAll, between);
    if (read != Reading::good)
        return read == Reading::cut ? Found::more : Found::nothing;
    if (between.kind == Kind::run) {
        clock_.reset();
        if (!isChosen_)
            use(between.variant);
    }
    found_ = between.size;
    item = itemOf(between.kind);
    item.count = between.kind == Kind::lost ? between.count : 0;
    return Found::item;
}

// `text` begins after the time lines.
LogParser::Found LogParser::findFrame(std::string_view text, const Header& header, bool isAll, Item& item) {
    const auto host = hostTime_.of(header.written, clock_.expected(header.ticks));
    if (!host)
        return Found::nothing;
    if (interface_->variant == Variant::unknown) {
        if (const Found guessed = guess({text.data() - header.size, text.size() + header.size}, isAll);
            guessed == Found::more)
            return guessed;
    }
    const Prover::Proof proof = prove(text, header, isAll);
    untitled_ = position_ + header.size + proof.untitled;
    isDoubtful_ = proof.isDoubtful && !isAll;
    if (proof.reading == Reading::cut || isDoubtful_)
        return Found::more;
    found_ = header.size + proof.size;
    isUnproved_ = proof.reading != Reading::good;
    item = itemOf(proof.isOversized ? Kind::oversized : Kind::frame);
    setFrame(proof, header, *host, item);
    if (isUnproved_)
        unproved_ = item;
    return isUnproved_ ? Found::nothing : Found::item;
}

// If another variant than before proves a frame, the log has that variant from here on.
Prover::Proof LogParser::prove(std::string_view text, const Header& header, bool isAll) {
    const auto proveBy = [&](Variant variant) {
        return prover_.prove(text, header.transmitted, variant, isAll, untitledFrom(header.size));
    };
    const Prover::Proof proof = proveBy(interface_->variant);
    if (proof.reading == Reading::good || !proof.sawDump || isChosen_)
        return proof;
    for (const Variant variant : allVariants) {
        if (proveBy(variant).reading != Reading::good)
            continue;
        use(variant);
        text_ = "from here on the text is that of a trunk of variant " + std::string(variantName(variant));
        before_.push_back(itemOf(Kind::comment, text_));
        break;
    }
    return proveBy(interface_->variant);
}

// Up to which place, counted from this place of the window, it is known that no title of a dump begins.
std::size_t LogParser::untitledFrom(std::size_t at) const {
    return untitled_ > position_ + at ? static_cast<std::size_t>(untitled_ - position_ - at) : 0;
}

// The text begins with a frame.
LogParser::Found LogParser::guess(std::string_view text, bool isAll) {
    bool mayCome = false;
    const std::vector<Variant> fitting = variantsThatFit(text, prover_, isAll, untitledFrom(0), mayCome);
    if (fitting.empty())
        return mayCome ? Found::more : Found::nothing;
    use(likeliestOf(fitting));
    if (fitting.size() > 1) {
        text_ = saying(fitting);
        before_.push_back(itemOf(Kind::comment, text_));
    }
    return Found::item;
}

void LogParser::setFrame(const Prover::Proof& proof, const Header& header, std::int64_t host, Item& item) {
    item.frame.place.number = line_ + 1;  // behind the empty line
    item.frame.transmitted = header.transmitted;
    item.frame.ticks = header.ticks;
    item.frame.written = host;
    item.frame.octets = proof.octets;
    if (proof.reading != Reading::good)
        return;
    const BoardClock::Verdict verdict = clock_.take(header.ticks, host);
    if (verdict == BoardClock::Verdict::restarted)
        before_.push_back(itemOf(Kind::restart, "the board's time stamps begin anew"));
    else if (verdict == BoardClock::Verdict::otherTrace && !std::exchange(saidMixed_, true))
        before_.push_back(
            itemOf(Kind::mixed, "time stamps of two traces alternate; frames of both are read"));
    item.frame.clock = capture::Clock::absolute;
    item.frame.time = clock_.time();
}

Item LogParser::itemOf(Kind kind, std::string_view text) const {
    Item item;
    item.kind = kind;
    item.text = text;
    item.frame.interface = interface_;
    item.frame.place = {source_.name(), line_, capture::Place::Unit::line};
    return item;
}

Reader::Next LogParser::deliver(Item& item) {
    toConsume_ = found_;
    if (passedLines_ > 0)
        before_.insert(before_.begin(), takePassed(false));
    if (!before_.empty()) {
        before_.push_back(item);
        item = before_[shown_++];
    }
    return Reader::Next::item;
}

void LogParser::consume(std::size_t octets) {
    line_ += lineEndsIn(source_.held().substr(0, octets));
    position_ += octets;
    source_.consume(octets);
}

// False when the line's end is not there yet.
bool LogParser::passLine() {
    std::size_t size = source_.held().find('\n');
    while (size == std::string_view::npos && source_.held().size() < longestLine) {
        const std::size_t before = source_.held().size();
        const Source::State state = source_.want(before + 1);
        if (state == Source::State::pause)
            return false;
        if (state == Source::State::end)
            break;
        size = source_.held().find('\n', before);
    }
    if (passedLines_ == 0) {
        passesFrame_ = isUnproved_;
        passed_ = passesFrame_ ? unproved_ : itemOf(Kind::unproved);
        passedOctets_.assign(passed_.frame.octets.begin(), passed_.frame.octets.end());
    }
    ++passedLines_;
    consume(size == std::string_view::npos ? source_.held().size() : size + 1);
    return true;
}

Item LogParser::takePassed(bool isEnd) {
    const bool isCut = passesFrame_ && isEnd;
    Item item = passed_;
    item.kind = isCut ? Kind::cut : Kind::unproved;
    item.frame.octets = isCut ? passedOctets_ : std::span<const std::uint8_t>();
    item.count = isCut ? 0 : std::exchange(passedLines_, 0);
    item.text = isCut          ? "the log ends within this frame"
                : passesFrame_ ? "the text of this frame is not what its dump says"
                               : "these lines are none that the recorder writes";
    passedLines_ = 0;
    return item;
}

}  // namespace

std::unique_ptr<capture::Parser> readLog(const capture::Context& context) {
    if (hasDosLineEnds(context.source.held()))
        context.source.joinLineEnds();
    return std::make_unique<LogParser>(context);
}

}  // namespace lapdlog

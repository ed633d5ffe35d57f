#include "reader/Redacting.h"

#include <algorithm>
#include <utility>

#include "calls/recording.h"
#include "capture/notes.h"
#include "reader/Feed.h"
#include "reader/errors.h"
#include "reader/text.h"

namespace reader {

namespace {

using Kind = capture::Item::Kind;

// What an item says, in words of our own instead of the words of its input.
std::string_view textOf(Kind kind) {
    const bool hasText =
        kind == Kind::cut || kind == Kind::mixed || kind == Kind::unproved || kind == Kind::damaged;
    return hasText ? calls::reasonOf(kind) : std::string_view();
}

constexpr std::string_view channelWord = "trunk";

std::string nameOf(std::string_view input) {
    return input.empty() || input == "-" ? std::string("the input") : safe(input);
}

// "trunk1" for the first name, "trunk2" for the second.
const std::string& numbered(Redacting::Names& known, std::string_view name, std::string_view word) {
    auto found = known.find(name);
    if (found == known.end())
        found = known.emplace(name, std::string(word) + std::to_string(known.size() + 1)).first;
    return found->second;
}

}  // namespace

bool namesKey(const capture::Item& item, const redaction::Key& key) {
    if (item.kind != Kind::comment || !item.text.starts_with(capture::redactedPrefix))
        return false;
    const std::string_view check = item.text.substr(capture::redactedPrefix.size());
    const std::string known = redaction::checkOf(key);
    if (check != known)
        throw FileError(nameOf(item.frame.place.file) + " was redacted with another key: its check is " +
                        safe(check) + ", that of this key " + known);
    return true;
}

Redacting::Redacting(const Options& options, const redaction::Key& key, redaction::Direction direction,
                     std::unique_ptr<Composer> composer, Consumer& next)
    : redactor_(key, direction, analysisOptions(options)),
      key_(key),
      hidesNames_(direction == redaction::Direction::redact),
      composer_(std::move(composer)),
      next_(next),
      callFilter_(options.filters) {
    // D channels that the options name come first, in the order in which behind() names them.
    for (const std::vector<std::string>& group : options.calls.groups) {
        for (const std::string& name : group)
            numbered(channels_, name, channelWord);
    }
    if (!callFilter_.isEmpty() && !next_.wantsAll())
        gate_.emplace(callFilter_, analysisOptions(options),
                      options.input.follow ? CallGate::Order::ofDecision : CallGate::Order::ofInput);
}

Options Redacting::behind(Options options) {
    Names known;
    for (std::vector<std::string>& group : options.calls.groups) {
        for (std::string& name : group)
            name = numbered(known, name, channelWord);
    }
    return options;
}

void Redacting::take(Chunk& chunk, std::size_t count) {
    idle_ = 0;
    std::size_t piece = 0;
    for (std::size_t i = 0; i < chunk.size(); ++i) {
        const bool passes = piece < count && chunk.pieces[piece].item == i;
        piece += passes ? 1 : 0;
        look(chunk.seen()[i], passes);
    }
    handOn();
}

void Redacting::advance(std::int64_t nanoseconds) {
    idle_ += nanoseconds;
    if (idle_ > redaction::TraceRedactor::longestWait)
        giveUp();
    if (gate_)
        gate_->advance(nanoseconds);
    handOn();
    next_.advance(nanoseconds);
    next_.flush();
}

void Redacting::finish() {
    giveUp();
    handOn();
    if (!gate_)
        return;
    gate_->finish();
    handOn();
}

void Redacting::giveUp() {
    std::vector<redaction::Rebuilt> done;
    redactor_.giveUp(done);
    settle(done);
    release();
}

void Redacting::look(const Seen& seen, bool passes) {
    if (seen.item->kind == Kind::comment && hidesNames_)
        return;
    if (namesKey(*seen.item, key_)) {
        knowsKey_ = true;
        return;
    }
    Waiting& waiting = waiting_.emplace_back();
    waiting.seen = seen;
    waiting.item = *seen.item;
    waiting.text = seen.item->text;
    waiting.passes = passes;
    redact(waiting);
    if (hidesNames_)
        replaceNames(waiting);
    if (waiting_.size() > mostWaiting)
        giveUp();
    release();
}

// Releases items, up to the first that waits for the rest of its message.
void Redacting::release() {
    while (!waiting_.empty() && waiting_.front().isReady) {
        Waiting& ready = waiting_.front();
        ready.item.frame.octets = ready.octets;
        ready.item.text = ready.text;
        ready.seen.item = &ready.item;
        out_.add(ready.seen);
        passes_.push_back(ready.passes);
        waiting_.pop_front();
    }
}

void Redacting::redact(Waiting& waiting) {
    const Seen& seen = waiting.seen;
    if (!seen.isFrame()) {
        if (seen.item->kind == Kind::cut)
            waiting.octets = redactor_.cut(seen.frame().octets, seen.variant);
        waiting.isReady = true;
        calls::tell(redactor_, *seen.item);
        return;
    }
    std::vector<redaction::Rebuilt> done;
    redactor_.take(seen.frame(), seen.number, seen.variant, done);
    settle(done);
}

// Searches from the end, because frames that are done are mostly the last ones.
void Redacting::settle(std::vector<redaction::Rebuilt>& done) {
    for (redaction::Rebuilt& rebuilt : done) {
        const auto found = std::find_if(waiting_.rbegin(), waiting_.rend(), [&](const Waiting& each) {
            return each.seen.isFrame() && each.seen.number == rebuilt.number;
        });
        if (found == waiting_.rend())
            continue;
        found->octets = std::move(rebuilt.octets);
        found->isReady = true;
    }
}

void Redacting::replaceNames(Waiting& waiting) {
    capture::Item& item = waiting.item;
    waiting.text = textOf(item.kind);
    item.frame.place.file = numbered(files_, item.frame.place.file, "input");
    if (item.frame.interface == nullptr)
        return;
    const capture::Interface wanted{numbered(channels_, item.frame.interface->name, channelWord),
                                    item.frame.interface->variant};
    auto found = std::find(interfaces_.begin(), interfaces_.end(), wanted);
    if (found == interfaces_.end())
        found = interfaces_.insert(interfaces_.end(), wanted);
    item.frame.interface = &*found;
}

void Redacting::handOn() {
    out_.seal();
    if (gate_)
        passGate();
    Chunk& chunk = gate_ ? released_ : out_;
    for (std::size_t i = 0; i < chunk.size(); ++i) {
        Seen& seen = chunk.seen()[i];
        readHeaders(seen);
        if (!gate_ && !passes_[i])
            continue;
        Piece piece{.item = i, .instant = {seen.when.clock, seen.at}};
        if (composer_ != nullptr)
            composer_->compose(seen, chunk.text, piece);
        piece.end = chunk.text.size();
        chunk.pieces.push_back(piece);
    }
    if (!chunk.pieces.empty() || (next_.wantsAll() && !chunk.empty()))
        next_.take(chunk, chunk.pieces.size());
    out_.clear();
    released_.clear();
    passes_.clear();
}

// Passes redacted items through the gate. Redaction comes first, because it needs the frames of all calls.
void Redacting::passGate() {
    for (std::size_t i = 0; i < out_.size(); ++i)
        gate_->take(out_.seen()[i], passes_[i]);
    while (const Seen* const seen = gate_->next())
        released_.add(*seen);
    released_.seal();
}

}  // namespace reader

#include "reader/redact.h"

#include "capture/Writer.h"
#include "capture/notes.h"
#include "reader/Redacting.h"
#include "reader/TextConsumer.h"
#include "reader/errors.h"
#include "reader/forms.h"
#include "reader/inputs.h"
#include "reader/session.h"

namespace reader {

namespace {

using redaction::Direction;
using redaction::Key;
using redaction::Manner;

void checkManner(const Options& options, const Key& key) {
    const RedactOptions& asked = options.redact;
    const Manner& manner = key.manner;
    if (asked.keepPrefix && *asked.keepPrefix != manner.keepPrefix)
        throw UsageError("the key " + asked.key + " was made with --keep-prefix " +
                         std::to_string(manner.keepPrefix) + ": another manner needs another key");
    if (asked.blankShort && !manner.blankShort)
        throw UsageError("the key " + asked.key +
                         " was made without --blank-short: another manner needs another key");
}

// The form of the output. If nothing else decides it, it is that of the first input.
const Form& formOf(const Options& options) {
    if (!options.form.empty())
        return formNamed(options.form);
    if (const Form* form = formOfFile(options.output.path); form != nullptr)
        return *form;
    const std::string beginning = beginningOf(inputFiles(options).front());
    for (const Form& form : forms()) {
        if (form.looksRight(beginning))
            return form;
    }
    throw UsageError("redact needs --to FORM, since the input's own form cannot be seen or written");
}

// Refuses inputs that were redacted with another key, before anything is written. Each names its key before
// its first frame. A pipe can be read only once, so it is asked for its first item, which run() gets as well.
void checkKeys(Session& session, const Options& options, const Key& key) {
    for (const std::string& file : inputFiles(options)) {
        if (!canBeReadAgain(file))
            continue;
        const auto reader = openFile(file, options.input);
        capture::Item item;
        while (reader->next(item) == capture::Reader::Next::item && !item.isFrame() && !namesKey(item, key)) {
        }
    }
    for (const capture::Item* const first : session.firstItems())
        namesKey(*first, key);
}

// Says in the output with which key it was made, if its form has a place for that.
void noteKey(capture::Writer& writer, const Key& key) {
    const capture::Interface first{Redacting::firstTrunk};
    const std::string text = std::string(capture::redactedPrefix) + redaction::checkOf(key);
    capture::Item note;
    note.kind = capture::Item::Kind::comment;
    note.frame.interface = &first;
    note.text = text;
    writer.write(note);
}

void write(Session& session, const Options& options, const Form& form, Output& out, const Key& key,
           Chatter& chatter) {
    const Direction direction = options.redact.undo ? Direction::restore : Direction::redact;
    const auto run = [&](Consumer& next, std::unique_ptr<Composer> composer) {
        Redacting redacting(options, key, direction, std::move(composer), next);
        session.run(redacting, [] { return std::make_unique<NoComposer>(); });
        redacting.finish();
        if (direction == Direction::restore && !redacting.knowsKey())
            chatter.note(
                "the input does not say with which key it was redacted: with another one, the numbers are "
                "wrong");
    };
    if (form.makeComposer != nullptr) {
        TextConsumer consumer(out);
        out.write(form.header);
        run(consumer, form.makeComposer());
        consumer.flush();
        return;
    }
    const auto writer = form.makeWriter(out.descriptor(), out.name());
    if (direction == Direction::redact)
        noteKey(*writer, key);
    WriterConsumer consumer(*writer, form, chatter);
    run(consumer, nullptr);
    consumer.finish();
}

}  // namespace

Key redactionKey(const Options& options, Chatter& chatter) {
    const RedactOptions& asked = options.redact;
    if (asked.key.empty() && asked.undo)
        throw UsageError("--undo needs --key FILE, the key that the pseudonyms were made with");
    const Manner manner{asked.keepPrefix.value_or(0), asked.blankShort};
    if (asked.key.empty())
        return redaction::randomKey(manner);
    if (const auto known = redaction::readKey(asked.key)) {
        checkManner(options, *known);
        return *known;
    }
    if (asked.undo)
        throw FileError("there is no key " + asked.key);
    const Key made = redaction::randomKey(manner);
    redaction::writeKey(asked.key, made);
    chatter.note("made the key " + asked.key + ": whoever has it can undo the redaction");
    return made;
}

std::span<const OptionRow> redactOptions() {
    static constexpr OptionRow rows[] = {
        {"--key", "FILE", "Make pseudonyms by this key, and make the key if there is none",
         [](Options& to, const std::string& value) { to.redact.key = value; }},
        {"--undo", "", "Put the originals in the place of pseudonyms; what was blanked stays blank",
         [](Options& to, const std::string&) { to.redact.undo = true; }},
        {"--keep-prefix", "N", "Keep the first N digits of each number, at most 9",
         [](Options& to, const std::string& value) {
             to.redact.keepPrefix = countIn(value, Manner::mostKept);
         }},
        {"--blank-short", "", "Blank numbers of fewer than six digits",
         [](Options& to, const std::string&) { to.redact.blankShort = true; }},
        {"--to", "pcapng|pcap|jsonl|csv|hex|log",
         "The form to write; without it the end of OUT's name tells, else it is that of the input",
         [](Options& to, const std::string& value) { to.form = formNamed(value).name; }},
    };
    return rows;
}

int runRedact(const Options& options, Chatter& chatter) {
    const Form& form = formOf(options);
    Session session(options, chatter, options.redact.undo ? Session::Pipes::atOnce : Session::Pipes::inTurn);
    session.tellGuessedVariant("redacted");
    const Key key = redactionKey(options, chatter);  // before an output is emptied
    if (options.redact.undo)
        checkKeys(session, options, key);
    Output& out = session.output(form.what, form.looksRight);
    if (form.binary && out.isTerminal())
        throw UsageError(std::string(form.name) +
                         " is not for a terminal: name a file, or send it through a pipe");
    write(session, options, form, out, key, chatter);
    return good;
}

}  // namespace reader

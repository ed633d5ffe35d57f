#include "reader/convert.h"

#include "reader/TextConsumer.h"
#include "reader/errors.h"
#include "reader/forms.h"
#include "reader/session.h"

namespace reader {

namespace {

// Without -o, the two words are IN and OUT. With -o, all words are inputs.
Options withOutput(Options options) {
    const std::size_t inputs = options.input.files.size() + options.words.size();
    if (!options.output.path.empty() || inputs < 2)
        return options;
    if (inputs > 2 || options.words.empty())
        throw UsageError("convert takes IN and OUT; for more than one input name the output with -o OUT");
    options.output.path = options.words.back();
    options.words.pop_back();
    return options;
}

const Form& formOf(const Options& options) {
    if (!options.form.empty())
        return formNamed(options.form);
    if (const Form* form = formOfFile(options.output.path); form != nullptr)
        return *form;
    throw UsageError("convert needs --to FORM, or an OUT whose name ends in one");
}

void write(Session& session, const Form& form, Output& out, Chatter& chatter) {
    if (form.makeComposer != nullptr) {
        TextConsumer consumer(out);
        out.write(form.header);
        session.run(consumer, form.makeComposer);
        return;
    }
    const auto writer = form.makeWriter(out.descriptor(), out.name());
    WriterConsumer consumer(*writer, form, chatter);
    session.run(consumer, [] { return std::make_unique<NoComposer>(); });
    consumer.finish();
}

}  // namespace

std::span<const OptionRow> convertOptions() {
    static constexpr OptionRow rows[] = {
        {"--to", "pcapng|pcap|jsonl|csv|hex|log", "The form to write; without it the end of OUT's name tells",
         [](Options& to, const std::string& value) { to.form = formNamed(value).name; }},
    };
    return rows;
}

int runConvert(const Options& given, Chatter& chatter) {
    const Options options = withOutput(given);
    const Form& form = formOf(options);
    Session session(options, chatter);
    Output& out = session.output(form.what, form.looksRight);
    if (form.binary && out.isTerminal())
        throw UsageError(std::string(form.name) +
                         " is not for a terminal: name a file, or send it through a pipe");
    write(session, form, out, chatter);
    return good;
}

}  // namespace reader

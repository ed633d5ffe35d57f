#include "reader/forms.h"

#include <algorithm>
#include <cerrno>

#include "capture/text_forms.h"
#include "capture/writers.h"
#include "lapdlog/LogWriter.h"
#include "lapdlog/log.h"
#include "reader/csv.h"
#include "reader/errors.h"
#include "reader/json.h"

namespace reader {

namespace {

template <class ComposerOfForm>
std::unique_ptr<Composer> make() {
    return std::make_unique<ComposerOfForm>();
}

bool looksLikePcapng(std::string_view beginning) { return beginning.starts_with("\x0a\x0d\x0d\x0a"); }

bool looksLikePcap(std::string_view beginning) {
    constexpr std::string_view marks[] = {"\xd4\xc3\xb2\xa1", "\xa1\xb2\xc3\xd4", "\x4d\x3c\xb2\xa1",
                                          "\xa1\xb2\x3c\x4d"};
    return std::any_of(std::begin(marks), std::end(marks),
                       [&](std::string_view mark) { return beginning.starts_with(mark); });
}

bool looksLikeHex(std::string_view beginning) {
    return capture::isHexLines(beginning, true) == capture::Form::Match::yes;
}
bool looksLikeLog(std::string_view beginning) {
    return lapdlog::isLog(beginning, true) == capture::Form::Match::yes;
}

std::unique_ptr<capture::Writer> makeLogWriter(int descriptor, const std::string& name) {
    return lapdlog::makeLogWriter(descriptor, name);
}

bool looksLikeJson(std::string_view beginning) { return beginning.starts_with("{\"v\":"); }
bool looksLikeCsv(std::string_view beginning) { return beginning.starts_with("n,file,"); }

// clang-format off
const Form table[] = {
    {"pcapng", "a pcapng capture",      true,  looksLikePcapng, "", nullptr, capture::makePcapngWriter, true, true},
    {"pcap",   "a pcap capture",        true,  looksLikePcap,   "", nullptr, capture::makePcapWriter, true},
    {"jsonl",  "JSON Lines of lapdread", false, looksLikeJson, "",          make<JsonComposer>, nullptr},
    {"csv",    "a CSV file of lapdread", false, looksLikeCsv,   csvHeader(), make<CsvComposer>, nullptr},
    {"hex",    "lines of hexadecimal digits", false, looksLikeHex, "", nullptr, capture::makeHexWriter},
    {"log",    "a log of lapdmon",      true,  looksLikeLog,    "", nullptr, makeLogWriter, true, true},
};
// clang-format on

std::string knownForms() {
    std::string known;
    for (const Form& form : table)
        (known += known.empty() ? "" : ", ") += form.name;
    return known;
}

// Runs `act`, and turns the exceptions of a writer into those of this program.
template <class Act>
void reporting(Act act) {
    try {
        act();
    } catch (const capture::WriteError& error) {
        if (error.reason == EPIPE)
            throw ReaderGone();
        throw FileError(error.what());
    }
}

}  // namespace

std::span<const Form> forms() { return table; }

const Form& formNamed(std::string_view name) {
    const auto* const found =
        std::find_if(std::begin(table), std::end(table), [&](const Form& form) { return form.name == name; });
    if (found == std::end(table))
        throw UsageError("there is no form " + std::string(name) + " (there are " + knownForms() + ")");
    return *found;
}

const Form* formOfFile(std::string_view path) {
    const auto* const found = std::find_if(std::begin(table), std::end(table), [&](const Form& form) {
        return path.size() > form.name.size() && path.ends_with(form.name) &&
               path[path.size() - form.name.size() - 1] == '.';
    });
    return found == std::end(table) ? nullptr : found;
}

void WriterConsumer::take(Chunk& chunk, std::size_t count) {
    reporting([&] {
        for (std::size_t i = 0; i < count; ++i)
            roles_.take(chunk.seen()[chunk.pieces[i].item], [&](const capture::Item& item) { write(item); });
    });
}

void WriterConsumer::write(const capture::Item& item) {
    if (needsTimeOfDay_ && item.isFrame() && item.frame.clock != capture::Clock::absolute) {
        needsTimeOfDay_ = false;
        chatter_.note("the input has no time of day: other programs will show times since 1 January 1970");
    }
    writer_.write(item);
}

void WriterConsumer::flush() {
    reporting([&] { writer_.flush(); });
}

void WriterConsumer::finish() {
    reporting([&] {
        roles_.giveUp([&](const capture::Item& item) { write(item); });
        writer_.finish();
    });
}

}  // namespace reader

#include "reader/forms.h"

#include <algorithm>
#include <cerrno>

#include "reader/csv.h"
#include "reader/errors.h"
#include "reader/json.h"

namespace reader {

namespace {

template <class ComposerOfForm>
std::unique_ptr<Composer> make() {
    return std::make_unique<ComposerOfForm>();
}

bool looksLikeJson(std::string_view beginning) { return beginning.starts_with("{\"v\":"); }
bool looksLikeCsv(std::string_view beginning) { return beginning.starts_with("n,file,"); }

// clang-format off
const Form table[] = {
    {"jsonl", "JSON Lines of lapdread", false, looksLikeJson, "",          make<JsonComposer>, nullptr},
    {"csv",   "a CSV file of lapdread", false, looksLikeCsv,  csvHeader(), make<CsvComposer>,  nullptr},
};
// clang-format on

std::string knownForms() {
    std::string known;
    for (const Form& form : table)
        (known += known.empty() ? "" : ", ") += form.name;
    return known;
}

// What a writer reports, in the words of this program.
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
            writer_.write(*chunk.seen()[chunk.pieces[i].item].item);
    });
}

void WriterConsumer::flush() {
    reporting([&] { writer_.flush(); });
}

void WriterConsumer::finish() {
    reporting([&] { writer_.finish(); });
}

}  // namespace reader

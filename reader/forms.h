// The forms in which frames are written.
#ifndef READER_FORMS_H
#define READER_FORMS_H

#include <functional>
#include <memory>
#include <span>
#include <string>
#include <string_view>

#include "capture/Writer.h"
#include "reader/Output.h"
#include "reader/Pipeline.h"
#include "reader/Roles.h"

namespace reader {

// A form is either text, which composers make, a line for each item, or it is made by a writer.
struct Form {
    std::string_view name;  // the name for --to, and the ending of files
    std::string_view what;  // "a pcapng capture"
    bool binary;            // it contains octets as they are, so it is not written to a terminal
    bool (*looksRight)(std::string_view beginning);  // whether a file that begins so has this form
    std::string_view header;                         // the first line of the text
    std::unique_ptr<Composer> (*makeComposer)();     // null if the form has a writer
    std::unique_ptr<capture::Writer> (*makeWriter)(int descriptor, const std::string& name);
    bool needsTimeOfDay = false;  // it cannot hold other times
    bool holdsOversized = false;  // it has a place for frames that are too long for a log
};

std::span<const Form> forms();

// Throws UsageError if no form has this name.
const Form& formNamed(std::string_view name);

// The form that belongs to the ending of a file's name, ".pcapng"; null if none does.
const Form* formOfFile(std::string_view path);

// Hands the items to the writer of a form, on the thread of the pipeline. Throws ReaderGone if the reader of
// a pipe has gone, and FileError if something cannot be written for another reason.
class WriterConsumer : public Consumer {
  public:
    // `form` is the form of the writer. Says once if it needs a time of day that frames do not have.
    WriterConsumer(capture::Writer& writer, const Form& form, Chatter& chatter)
        : writer_(writer), chatter_(chatter), roles_(chatter), needsTimeOfDay_(form.needsTimeOfDay) {}

    void take(Chunk& chunk, std::size_t count) override;
    void flush() override;
    // Ends the output.
    void finish();

  private:
    void write(const capture::Item& item);

    capture::Writer& writer_;
    Chatter& chatter_;
    Roles roles_;
    bool needsTimeOfDay_;  // false once that was said
};

// Composes nothing, for consumers that need only the items.
class NoComposer : public Composer {
  public:
    void compose(const Seen& /*seen*/, std::string& /*text*/, Piece& /*piece*/) override {}
};

}  // namespace reader

#endif

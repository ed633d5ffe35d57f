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

// A form is either text that composers make, a line an item, or what a writer makes of the items.
struct Form {
    std::string_view name;                           // as --to and the end of a file's name have it
    std::string_view what;                           // "a pcapng capture"
    bool binary;                                     // holds octets as they are, and so is not for a terminal
    bool (*looksRight)(std::string_view beginning);  // of a file of this form
    std::string_view header;                         // of text
    std::unique_ptr<Composer> (*makeComposer)();     // null if there is a writer
    std::unique_ptr<capture::Writer> (*makeWriter)(int descriptor, const std::string& name);
    bool needsTimeOfDay = false;  // it has no other times
};

std::span<const Form> forms();

// Throws UsageError for a name that is none.
const Form& formNamed(std::string_view name);

// By the end of a file's name, ".pcapng"; null if it tells nothing.
const Form* formOfFile(std::string_view path);

// For forms with a writer: the items go to it, on the thread of the pipeline. Reports that the reader of a
// pipe has gone as ReaderGone, and what else cannot be written as FileError.
class WriterConsumer : public Consumer {
  public:
    // `form` is the writer's. Says once if it needs a time of day that frames do not have.
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
    bool needsTimeOfDay_;  // until it was said
};

// Composes nothing: the items themselves are wanted.
class NoComposer : public Composer {
  public:
    void compose(const Seen& /*seen*/, std::string& /*text*/, Piece& /*piece*/) override {}
};

}  // namespace reader

#endif

// Opens the inputs and the output of a command, and moves the items between them.
#ifndef READER_SESSION_H
#define READER_SESSION_H

#include <functional>
#include <memory>
#include <vector>

#include "capture/Reader.h"
#include "reader/CallFilter.h"
#include "reader/Chatter.h"
#include "reader/Filter.h"
#include "reader/Options.h"
#include "reader/Output.h"
#include "reader/Pipeline.h"
#include "reader/Primed.h"
#include "reader/Tracker.h"
#include "reader/outputs.h"

namespace reader {

// Whether the options and the terminal allow colours on this output.
bool useColors(const OutputOptions& options, const Output& out);

// Owns the inputs and the output that the options name. There is one in the process.
class Session {
  public:
    // When to open the inputs that can be read only once.
    enum class Pipes : std::uint8_t { inTurn, atOnce };

    // Opens the inputs. Throws UsageError or FileError. From now on SIGINT and SIGTERM end the work in order.
    Session(const Options& options, Chatter& chatter, Pipes pipes = Pipes::inTurn);

    // Opened by the first call: standard output, or the file that the options name, created or emptied. That
    // happens only once all inputs are known to have a form that can be read, so an input that cannot be read
    // leaves the file as it was; so does a signal before the first item (StoppedEarly). A file that is
    // neither empty nor of the right form ("text") is refused with FileError, and so is one of the inputs.
    Output& output(std::string_view form = "", bool (*looksRight)(std::string_view) = looksLikeNothing);
    // Waits for the first item of each input that was opened at once. run() hands them on like the others.
    // Inputs that are empty give none. Throws StoppedEarly if a signal comes before they are there. To be
    // called before output().
    std::vector<const capture::Item*> firstItems();
    bool useColors() { return reader::useColors(options_.output, output()); }

    // Says once if frames are `done` ("decoded") by the rules of a variant that nobody has named.
    void tellGuessedVariant(std::string_view done) { tracker_.tellGuessedVariant(chatter_, done); }

    // Says that the command uses only octets and times. Without filters, the links need not be followed then.
    void needOnlyOctets() {
        if (options_.filters.empty())
            tracker_.leaveLinksAlone();
    }

    // Hands the items that pass the filters to the consumer, up to the end of the inputs. Throws FileError if
    // an input cannot be read.
    void run(Consumer& consumer, const std::function<std::unique_ptr<Composer>()>& makeComposer);

  private:
    void awaitInputs();
    void tellWhatWasNotFound(const Outcome& outcome, const CallGate* gate);

    const Options& options_;
    Chatter& chatter_;
    Filter filter_;
    CallFilter callFilter_;
    Tracker tracker_;
    std::vector<Primed*> pipes_;  // the inputs that were opened at once; reader_ owns them
    Primed reader_;
    std::unique_ptr<Output> output_;
};

}  // namespace reader

#endif

// Puts pseudonyms into the items of a run before they are written.
#ifndef READER_REDACTING_H
#define READER_REDACTING_H

#include <cstdint>
#include <deque>
#include <list>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "reader/CallGate.h"
#include "reader/Pipeline.h"
#include "redaction/TraceRedactor.h"

namespace reader {

// Whether the item says that the input was redacted with this key. Throws FileError if it was another one.
bool namesKey(const capture::Item& item, const redaction::Key& key);

// Takes the items of a run and hands them on, redacted, to the consumer that writes. It looks at every item,
// because a number may have begun in a frame that the filters drop. It hands on the items that pass the
// filters, or all items if the consumer wants all. It replaces names of files and D channels, drops comments,
// and replaces texts of what the recorder said by our own words. When it restores, it leaves all these as
// they are.
class Redacting : public Consumer {
  public:
    using Names = std::map<std::string, std::string, std::less<>>;  // by the original

    static constexpr const char* firstTrunk = "trunk1";  // the name that the first D channel gets

    // `composer` may be null if the next consumer wants no text. All references must outlive this object.
    Redacting(const Options& options, const redaction::Key& key, redaction::Direction direction,
              std::unique_ptr<Composer> composer, Consumer& next);

    // The options for an analysis that takes what this object hands on, and so knows D channels only by their
    // new names.
    static Options behind(Options options);

    void take(Chunk& chunk, std::size_t count) override;
    bool wantsAll() const override { return true; }
    void advance(std::int64_t nanoseconds) override;
    void flush() override { next_.flush(); }
    // The input has ended.
    void finish();
    // Whether the input says that it was redacted with this key. While pseudonyms are undone, take() throws
    // FileError if it was another one.
    bool knowsKey() const { return knowsKey_; }

  private:
    // A frame that waits for the end of its message, or an item after such a frame.
    struct Waiting {
        Seen seen;
        capture::Item item;
        std::vector<std::uint8_t> octets;
        std::string text;
        bool isReady = false;
        bool passes = false;
    };

    // The most items that wait for the end of a message.
    static constexpr std::size_t mostWaiting = 4096;

    void look(const Seen& seen, bool passes);
    void redact(Waiting& waiting);
    void settle(std::vector<redaction::Rebuilt>& done);
    void replaceNames(Waiting& waiting);
    void release();
    void giveUp();
    void handOn();
    void passGate();

    redaction::TraceRedactor redactor_;
    redaction::Key key_;
    bool knowsKey_ = false;
    bool hidesNames_;
    std::unique_ptr<Composer> composer_;
    Consumer& next_;
    std::deque<Waiting> waiting_;
    std::int64_t idle_ = 0;  // how long nothing has come, in nanoseconds
    Chunk out_;
    std::vector<bool> passes_;  // of the items of out_
    CallFilter callFilter_;
    std::optional<CallGate> gate_;  // if whole calls are asked for
    Chunk released_;                // the items that the gate has let through
    Names channels_;                // the new names of D channels
    Names files_;
    std::list<capture::Interface> interfaces_;
};

}  // namespace reader

#endif

// What the command line asks for.
#ifndef READER_OPTIONS_H
#define READER_OPTIONS_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "calls/Finding.h"
#include "calls/Occupancy.h"
#include "calls/Timers.h"
#include "capture/Frame.h"
#include "reader/Chatter.h"
#include "reader/Comparison.h"
#include "reader/TimeText.h"

namespace reader {

enum class ColorMode { automatic, always, never };

// A filter as it was typed: "--not --callref 0378".
struct FilterWord {
    std::string name;  // without the dashes
    std::string value;
    bool negated = false;
};

// Names an input, and how it is read.
struct InputOptions {
    std::vector<std::string> files;  // "-" is the standard input
    bool follow = false;
    bool merge = false;
    std::string trunk;  // the D channel's name; empty: as the input has it
    std::string store;  // the URL of a fleet's store that is read instead of files; `trunk` chooses there
    std::vector<std::string> sites;  // of the store; empty: all
    bool storeHasSeveral = false;    // more than one D channel of the store is chosen
    capture::Role role = capture::Role::unknown;
    capture::Variant variant = capture::Variant::unknown;
    std::string zone;
};

struct OutputOptions {
    std::string path;  // empty or "-": standard output
    ColorMode color = ColorMode::automatic;
    bool lineBuffered = false;
    unsigned jobs = 0;  // 0: one for each processor
};

struct ListOptions {
    TimeForm time = TimeForm::absolute;
    bool wide = false;
    bool trunk = false;                // the usual columns name the D channel as well
    std::vector<std::string> columns;  // empty: those of `wide`, or the usual ones
};

enum class ExplainAs { guess, frame, element };

struct RecordOptions {
    std::string folder = ".";
    std::uint64_t size = 0;    // octets of a file; 0: no limit
    std::int64_t seconds = 0;  // a new file at each multiple of it in local time; 0: never
    unsigned files = 0;        // how many files are kept; 0: all
    std::int64_t span = 0;     // seconds; files that hold only what is older than this are removed; 0: none
    // Triggers: findings of this severity or a worse one, and frames that pass one of these filters.
    std::optional<calls::Severity> onCheck = std::nullopt;
    std::vector<FilterWord> onFrames;
    std::int64_t before = 300;  // how many seconds before a trigger are kept
    std::int64_t after = 60;    // how many seconds after it are kept
    unsigned keptFiles = 0;     // how many files are kept of what surrounds triggers; 0: all
};

enum class CallForm { text, csv, jsonLines };

// Options about calls. Timers and groups matter wherever frames are assigned to calls.
struct CallOptions {
    calls::Timers timers;
    std::vector<std::vector<std::string>> groups;  // names of D channels that share their calls
    CallForm form = CallForm::text;
    std::string sort;                                      // empty: in the order of their end
    calls::TrunkSize trunk = calls::TrunkSize::unknown;    // of the figures; unknown: learnt
    bool overTime = false;                                 // `stats` also shows what happened over time
    calls::Severity least = calls::Severity::note;         // findings of a lower severity are not shown
    std::optional<calls::Severity> failOn = std::nullopt;  // exit status 3 for such a finding or a worse one
};

enum class LadderForm { text, svg, mermaid };

struct LadderOptions {
    LadderForm form = LadderForm::text;
    unsigned width = 0;  // columns; 0: those of the terminal
    bool ascii = false;
    bool dChannels = false;  // each arrow names its D channel
};

struct BrowseOptions {
    std::size_t frames = 1'000'000;  // the most frames that are kept in memory
    bool mouse = true;
};

struct RedactOptions {
    std::string key;  // the key's file; empty: a key that nobody keeps
    bool undo = false;
    bool inReport = false;  // `report` shows pseudonyms
    std::optional<unsigned> keepPrefix = std::nullopt;
    bool blankShort = false;
};

struct Options {
    std::vector<std::string> words;  // files, or the hexadecimal digits that `explain` takes
    InputOptions input;
    OutputOptions output;
    std::vector<FilterWord> filters;
    std::uint64_t first = 0;    // how many frames are shown; 0: all
    std::uint64_t skipped = 0;  // how many are left out in front of them
    Loudness loudness = Loudness::usual;
    ListOptions list;
    ExplainAs explainAs = ExplainAs::guess;
    std::string form;  // the form to convert to, or to record in
    RecordOptions record;
    CallOptions calls;
    CompareAlso compareAlso;  // of two calls or traces
    bool failOnDifference = false;
    LadderOptions ladder;
    RedactOptions redact;
    BrowseOptions browse;
};

}  // namespace reader

#endif

#include "reader/commands.h"

#include <algorithm>
#include <array>

#include "reader/browse/browse.h"
#include "reader/calls.h"
#include "reader/check.h"
#include "reader/convert.h"
#include "reader/decode.h"
#include "reader/diff.h"
#include "reader/explain.h"
#include "reader/ladder.h"
#include "reader/list.h"
#include "reader/record.h"
#include "reader/redact.h"
#include "reader/report/report.h"
#include "reader/stats.h"

namespace reader {

namespace {

constexpr char listExamples[] = R"(  lapdread lapdmon.log
      a line a frame
  lapdread --no-keepalive --callref 0378 lapdmon.log
      one call, without the link's polls
  lapdread --follow --message SETUP,DISCONNECT lapdmon.log
      calls as they come and go
  lapdread --columns time,dir,message,details day1.pcapng day2.pcapng
      two files, one after another, and four columns
)";

constexpr char decodeExamples[] = R"(  lapdread decode day.pcapng
      what lapdmon would have written of these frames
  lapdread decode --variant ni2 --callref 0378 day.pcap
      one call of an NI2 trunk
)";

constexpr char explainExamples[] = R"(  lapdread explain 08 02 80 90
      an element: its second octet tells its length
  lapdread explain 02 01 01 97
      a frame
  lapdread explain --callref 0378 --message DISCONNECT lapdmon.log
      frames of a file
)";

constexpr char convertExamples[] = R"(  lapdread convert lapdmon.log day.pcapng
      a capture that Wireshark opens, with direction, role and times
  lapdread convert --to jsonl --message SETUP lapdmon.log
      a JSON object a frame, to standard output
  lapdread convert --follow --to pcapng lapdmon.log - | tshark -l -r -
      the trunk as it runs
)";

constexpr char recordExamples[] =
    R"(  lapdread record --folder /var/log/trunks --time 1h --files 168 lapdmon.log
      a week of files of an hour each, while lapdmon writes its log
  mkfifo trace; lapdread record --trunk pri1 --size 100M trace & lapdmon -b1 -f trace
      without a log beside them
)";

constexpr char callsExamples[] = R"(  lapdread calls lapdmon.log
      a line a call: who called whom, on which channel, how fast, who cleared it and why
  lapdread calls --failed --sort cause day*.pcapng
      what failed
  lapdread calls --csv --number 0301 lapdmon.log > calls.csv
      calls of one subscriber, for a spreadsheet
)";

constexpr char ladderExamples[] = R"(  lapdread ladder --call 3 lapdmon.log
      one call, for a ticket; `lapdread calls` prints the numbers
  lapdread ladder --failed --first 5 lapdmon.log
      the first five calls that failed
  lapdread ladder --svg --call 3 lapdmon.log > call.svg
      a picture
)";

constexpr char checkExamples[] = R"(  lapdread check lapdmon.log
      what is wrong with the trunk: links, calls, channels
  lapdread check --level warning --timer T305=4s day.pcapng
      without notes, on a network that waits 4 s for RELEASE
  lapdread check --fail-on error --quiet lapdmon.log || mail -s trunk me
      exit status 3 if there is an error
)";

constexpr char diffExamples[] = R"(  lapdread diff lapdmon.log#3 lapdmon.log#7
      two calls, by their numbers in `lapdread calls lapdmon.log`: what differs in their messages
  lapdread diff --message SETUP yesterday.pcapng today.pcapng
      two traces; of them one message
)";

constexpr char statsExamples[] = R"(  lapdread stats lapdmon.log
      messages, causes, times, calls by direction and hour, channels
  lapdread stats --csv --e1 day*.pcapng > figures.csv
      a row a figure, for a spreadsheet
)";

constexpr char reportExamples[] = R"(  lapdread report lapdmon.log -o report.html
      a page to open in a browser: summary, charts, calls, ladders of those that failed, findings
  lapdread report --redact --since 2026-11-21T11:00 --until 2026-11-21T13:00 lapdmon.log -o noon.html
      two hours, for the carrier: pseudonyms in place of numbers and names
)";

constexpr char redactExamples[] = R"(  lapdread redact lapdmon.log -o for-the-carrier.log
      numbers, names and user data are replaced; nobody can undo it
  lapdread redact --key trunk.key --callref 0378 --to pcapng lapdmon.log -o call.pcapng
      one call, as a capture; the key gives the same pseudonyms next time
  lapdread redact --key trunk.key --undo answer.pcapng -o answer-with-numbers.pcapng
      the numbers again, for whoever has the key
)";

constexpr char browseExamples[] = R"(  lapdread browse lapdmon.log
      look around: calls, ladders, messages, findings
  lapdread browse --follow lapdmon.log
      the trunk as it runs
  ssh host lapdread convert --follow --to pcapng /var/log/lapdmon.log - | lapdread browse -
      the trunk of another machine
)";

const std::array table{
    Command{"list",
            "[FILE...]",
            "a line a frame; what lapdread does when no command is named",
            listExamples,
            {"Lines", listOptions()},
            runList},
    Command{"decode", "[FILE...]", "frames in the words of lapdmon's log", decodeExamples, OptionGroup(),
            runDecode},
    Command{"explain",
            "[HEX|FILE...]",
            "every octet of a frame or an element: its bits, its field, what it means",
            explainExamples,
            {"Octets", explainOptions()},
            runExplain},
    Command{"browse",
            "[FILE...]",
            "screens to look around in: trunk, calls, ladders, messages, findings",
            browseExamples,
            {"Screens", browseOptions()},
            runBrowse},
    Command{"calls", "[FILE...]", "a line a call", callsExamples, {"Calls", callsOptions()}, runCalls},
    Command{"ladder",
            "[FILE...]",
            "the messages of calls as arrows between both sides",
            ladderExamples,
            {"Ladder", ladderOptions()},
            runLadder},
    Command{"check",
            "[FILE...]",
            "what is wrong, and what to look at next",
            checkExamples,
            {"Findings", checkOptions()},
            runCheck},
    Command{"diff",
            "A[#CALL] B[#CALL]",
            "what differs between two calls, or two traces, down to the field",
            diffExamples,
            {"Comparison", diffOptions()},
            runDiff},
    Command{"stats",
            "[FILE...]",
            "figures: messages, causes, times, calls by direction and hour, channels",
            statsExamples,
            {"Figures", statsOptions()},
            runStats},
    Command{"report",
            "[FILE...]",
            "a page for a browser: summary, charts, calls, findings",
            reportExamples,
            {"Report", reportOptions()},
            runReport},
    Command{"convert",
            "IN [OUT]",
            "frames in files that other tools read",
            convertExamples,
            {"Form", convertOptions()},
            runConvert},
    Command{"record",
            "[FILE...]",
            "files that begin anew by size or time; follows its input, and ends by a signal",
            recordExamples,
            {"Files", recordOptions()},
            runRecord,
            true},
    Command{"redact",
            "[FILE...]",
            "frames without what names a person, in files that may be sent to others",
            redactExamples,
            {"Redaction", redactOptions()},
            runRedact,
            true},
};

}  // namespace

std::span<const Command> commands() { return table; }

const Command* commandNamed(std::string_view name) {
    const auto* const found = std::find_if(table.begin(), table.end(),
                                           [&](const Command& command) { return command.name == name; });
    return found == table.end() ? nullptr : found;
}

}  // namespace reader

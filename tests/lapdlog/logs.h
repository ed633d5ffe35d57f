// Logs for tests, as lapdmon writes them, and what is read in them.
#ifndef TESTS_LAPDLOG_LOGS_H
#define TESTS_LAPDLOG_LOGS_H

#include <string>
#include <vector>

#include "decoder/cursor.h"
#include "decoder/frame.h"
#include "decoder/lines.h"
#include "decoder/log_lines.h"
#include "decoder/time_lines.h"
#include "lapdlog/log.h"
#include "tests/capture/reading.h"

namespace lapdlog::testing {

using Octets = capture::testing::Octets;

inline const Octets sabme{0x00, 0x01, 0x7f};
inline const Octets ua{0x00, 0x01, 0x73};
inline const Octets tenOctets{0x02, 0x01, 0x00, 0x00, 0x08, 0x02, 0x03, 0x78, 0x0f, 0xa1};
// A SETUP whose text differs between trunks that show elements in full and others.
inline const Octets setup{0x02, 0x01, 0x00, 0x00, 0x08, 0x02, 0x00, 0x01, 0x05, 0x04, 0x03, 0x80,
                          0x90, 0xa3, 0x18, 0x03, 0xa9, 0x83, 0x9e, 0x70, 0x03, 0x80, 0x31, 0x32};

// The text of a frame as the decoder writes it; `date` is the time line's.
inline std::string textOf(bool transmitted, unsigned ticks, const Octets& octets, int swit = 7,
                          const std::string& date = "Sat Nov 21 11:25:33 2026") {
    decoder::lineBuffer.clear();
    decoder::timeLines(transmitted, ticks, date + "\n");
    decoder::swit = swit;
    decoder::msglen = static_cast<int>(octets.size());
    if (octets.size() > decoder::maximumFrame) {
        decoder::line("Oversized frame, frame will not be interpreted ");
        decoder::line("Frame Error ");
    } else {
        decoder::RingBuffer frame;
        decoder::getBlock(&frame, octets, decoder::msglen);
        decoder::composeFrame(frame);
    }
    const std::string text(decoder::lineBuffer.composed());
    decoder::lineBuffer.clear();
    return text;
}

inline const std::string headText =
    "\nOrvane KV9 ISDN Trace Utility\n"
    "Records the D-channel signalling of one trunk, decoded.\n"
    "Version 1.00-Build-04 lapdmon\n";
inline const std::string net5Head = headText + "NET5 Switch \n";

inline std::vector<capture::Form> logAlone() { return {logForm}; }

// The items of a log, in the words of capture::testing::shown.
inline std::string itemsIn(const std::string& text, capture::ReadOptions options = {}) {
    const std::vector<capture::Form> forms = logAlone();
    const capture::testing::MemoryFile file(text);
    return capture::testing::itemsIn(file.path(), options, forms);
}

}  // namespace lapdlog::testing

#endif

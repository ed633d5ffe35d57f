// One run of the traced program on the software board.
#ifndef BENCH_ROAD_RUN_H
#define BENCH_ROAD_RUN_H

#include <cstdint>
#include <string>
#include <vector>

#include "bench/road/log_watch.h"

namespace bench {

struct Run {
    double seconds = 0;        // from the first frame in the log to the last one wanted
    double cpuSeconds = 0;     // of the process in that time, the software board included
    std::uint64_t frames = 0;  // in that time
    // Of each frame, from nvMsgRead to its header line in the log; microseconds.
    std::vector<double> latencies;
    long mostThreads = 0;
    long peakKilobytes = 0;  // resident
    int status = 0;          // of the process
    Checked checked;
};

// Runs until so many frames are in the log, then ends the trace as an operator would. `rate` is the software
// board's. Throws std::system_error.
Run runRoad(const std::string& rate, std::uint64_t frames);

// readEvents of reading.h in a process of its own at the board's rate: microseconds, 0 when it failed.
double runReading(const std::string& rate, double seconds, bool threadForEach);

}  // namespace bench

#endif

// Runs lapdmon on the software board and measures it.
#ifndef BENCH_ROAD_RUN_H
#define BENCH_ROAD_RUN_H

#include <cstdint>
#include <string>
#include <vector>

#include "bench/road/log_watch.h"

namespace bench {

struct Run {
    double seconds = 0;        // from the first frame in the log to the last one that was wanted
    double cpuSeconds = 0;     // processor time of the process in that time, the software board included
    std::uint64_t frames = 0;  // frames in that time
    // For each frame, the microseconds from nvMsgRead to its header line in the log.
    std::vector<double> latencies;
    long mostThreads = 0;
    long peakKilobytes = 0;  // resident memory
    int status = 0;          // exit status as of waitpid
    Checked checked;
};

// Runs the trace until so many frames are in the log, then ends it by typing "q". `rate` is an argument of
// the software board's --rate. Throws std::system_error when a system call fails.
Run runRoad(const std::string& rate, std::uint64_t frames);

// Runs readEvents (reading.h) in a process of its own at this rate. Returns its microseconds, or 0 when it
// failed.
double runReading(const std::string& rate, double seconds, bool threadForEach);

}  // namespace bench

#endif

// What a frame costs before the program has done anything with it.
#ifndef BENCH_ROAD_READING_H
#define BENCH_ROAD_READING_H

namespace bench {

// Reads the board's events for so many seconds and throws them away, each on a thread of its own if asked to.
// Returns the processor's microseconds an event, the software board's included.
double readEvents(double seconds, bool threadForEach);

}  // namespace bench

#endif

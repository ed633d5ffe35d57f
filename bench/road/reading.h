// Measures what an event costs before the program has done anything with it.
#ifndef BENCH_ROAD_READING_H
#define BENCH_ROAD_READING_H

namespace bench {

// Reads the board's events for so many seconds and frees them. If threadForEach is set, also starts a thread
// that does nothing for each event. Returns the microseconds of processor time an event, including those of
// the software board.
double readEvents(double seconds, bool threadForEach);

}  // namespace bench

#endif

// The program that is measured: lapdmon unchanged, except that each event that nvMsgRead returns gets a
// stamp.
#ifndef BENCH_ROAD_TRACED_H
#define BENCH_ROAD_TRACED_H

namespace bench {

// Traces board 1 into this log and adds stamps to the Stamps in the file of the descriptor. Returns the exit
// status.
int runTraced(int stampsDescriptor, char* log);

}  // namespace bench

#endif

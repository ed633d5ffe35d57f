// The program that is measured: lapdmon as it is, but for a stamp on each event that nvMsgRead returns.
#ifndef BENCH_ROAD_TRACED_H
#define BENCH_ROAD_TRACED_H

namespace bench {

// Runs it on board 1 with the log given, and stamps into the Stamps behind the descriptor. Its exit status.
int runTraced(int stampsDescriptor, char* log);

}  // namespace bench

#endif

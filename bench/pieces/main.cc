// What single pieces cost: text of a frame, bodies of messages, a request.
//
//     bench-pieces [--benchmark_filter=REGEX] ...
#include <benchmark/benchmark.h>

BENCHMARK_MAIN();

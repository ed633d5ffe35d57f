// Measures single pieces with Google Benchmark: the text of a frame, the bodies of messages, a request.
//
//     bench-pieces [--benchmark_filter=REGEX] ...
#include <benchmark/benchmark.h>

BENCHMARK_MAIN();

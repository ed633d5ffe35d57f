// The times at which the traced program read each event from the transport, in memory that it shares with the
// bench.
#ifndef BENCH_ROAD_STAMPS_H
#define BENCH_ROAD_STAMPS_H

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <ctime>

namespace bench {

// The time in nanoseconds, on a clock that is the same for all processes.
inline std::int64_t nowNs() {
    std::timespec now{};
    clock_gettime(CLOCK_MONOTONIC, &now);
    return now.tv_sec * std::int64_t{1000000000} + now.tv_nsec;
}

// One process adds a stamp for each event in the order of arrival, and another reads them. A stamp is
// overwritten after `kept` more events. The program that is measured reads no more events while `mostAhead`
// of them are not in the log yet; otherwise a board that is faster than the program would only fill its
// memory.
struct Stamps {
    static constexpr std::size_t kept = std::size_t{1} << 16;
    static constexpr std::uint64_t mostAhead = 2000;

    void add(std::int64_t at) {
        const std::uint64_t i = count.load(std::memory_order_relaxed);
        stamp[i % kept].store(at, std::memory_order_relaxed);
        count.store(i + 1, std::memory_order_release);
    }
    bool tooFarAhead() const { return count.load() > seen.load() + mostAhead; }
    std::int64_t of(std::uint64_t i) const { return stamp[i % kept].load(std::memory_order_relaxed); }

    std::atomic<std::uint64_t> count;
    std::atomic<std::uint64_t> seen;  // in the log, so far; kept by the one that reads
    std::atomic<std::int64_t> stamp[kept];
};

}  // namespace bench

#endif

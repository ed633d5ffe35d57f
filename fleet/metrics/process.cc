#include "fleet/metrics/process.h"

#include <chrono>

namespace fleet {

namespace {

// Initialised when the program begins.
const std::int64_t begun = nanosecondsNow();

}  // namespace

std::int64_t nanosecondsNow() {
    return std::chrono::duration_cast<std::chrono::nanoseconds>(
               std::chrono::system_clock::now().time_since_epoch())
        .count();
}

void describeProcess(Exposition& to, const std::string& program, const std::string& version) {
    to.family(program + "_build_info", Exposition::Type::gauge, "1, with the version of the program.");
    to.sample({{"version", version}}, std::uint64_t{1});
    constexpr std::int64_t perSecond = 1'000'000'000;
    to.single("process_start_time_seconds", Exposition::Type::gauge, "When the process began, since 1970.",
              static_cast<std::uint64_t>(begun / perSecond));
}

}  // namespace fleet

#include "reader/Feed.h"

#include "calls/recording.h"
#include "calls/standardVariant.h"

namespace reader {

calls::Options analysisOptions(const Options& options) {
    calls::Options to;
    to.timers = options.calls.timers;
    to.role = options.input.role;
    to.groups = options.calls.groups;
    if (options.input.variant != capture::Variant::unknown)
        to.variant = calls::standardVariant(options.input.variant);
    return to;
}

void feed(calls::Analysis& analysis, const Seen& seen) { calls::feed(analysis, *seen.item, seen.number); }

}  // namespace reader

// For each kind of finding a story in which it must appear, and one like it in which it must not.
#ifndef TESTS_CALLS_SCENARIOS_H
#define TESTS_CALLS_SCENARIOS_H

#include <span>
#include <string>

#include "calls/Finding.h"

namespace calls::test {

struct Scenario {
    const FindingKind* kind;
    // Runs a story through the whole analysis; returns the identifiers of what was found, a line each.
    std::string (*found)(bool faulty);
};
std::span<const Scenario> linkScenarios();
std::span<const Scenario> callScenarios();
std::span<const Scenario> channelScenarios();

}  // namespace calls::test

#endif

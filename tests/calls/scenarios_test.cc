#include "tests/calls/scenarios.h"

#include <gtest/gtest.h>

#include <set>
#include <vector>

namespace calls {

namespace {

using test::Scenario;

std::vector<Scenario> allScenarios() {
    std::vector<Scenario> all;
    for (const std::span<const Scenario> some :
         {test::linkScenarios(), test::callScenarios(), test::channelScenarios()})
        all.insert(all.end(), some.begin(), some.end());
    return all;
}

bool shows(const Scenario& scenario, bool faulty, std::string& found) {
    found = "\n" + scenario.found(faulty);
    return found.find("\n" + std::string(scenario.kind->id) + "\n") != std::string::npos;
}

}  // namespace

TEST(Scenarios, CoverEveryKindOfFinding) {
    std::set<const FindingKind*> covered;
    for (const Scenario& scenario : allScenarios())
        covered.insert(scenario.kind);
    for (const FindingKind* const kind : findingKinds())
        EXPECT_TRUE(covered.contains(kind)) << kind->id;
}

TEST(Scenarios, ShowWhatTheyMust) {
    for (const Scenario& scenario : allScenarios()) {
        std::string found;
        EXPECT_TRUE(shows(scenario, true, found)) << scenario.kind->id << ":" << found;
    }
}

TEST(Scenarios, DoNotShowWhatTheyMustNot) {
    for (const Scenario& scenario : allScenarios()) {
        std::string found;
        EXPECT_FALSE(shows(scenario, false, found)) << scenario.kind->id << ":" << found;
    }
}

}  // namespace calls

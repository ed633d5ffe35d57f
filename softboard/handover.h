// How the launcher hands the scenario to the library in the program that it becomes.
#ifndef SOFTBOARD_HANDOVER_H
#define SOFTBOARD_HANDOVER_H

namespace softboard {

// The environment variable that holds the path of a file with the scenario as JSON (scenario.h: toJson).
constexpr const char* scenarioVariable = "SOFTBOARD_SCENARIO";

}  // namespace softboard

#endif

// How the launcher leaves the scenario for the library.
#ifndef SOFTBOARD_HANDOVER_H
#define SOFTBOARD_HANDOVER_H

namespace softboard {

// The environment variable with the path of the scenario's text.
constexpr const char* scenarioVariable = "SOFTBOARD_SCENARIO";

}  // namespace softboard

#endif

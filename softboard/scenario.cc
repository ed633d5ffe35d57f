#include "softboard/scenario.h"

namespace softboard {

Scenario oneChannel(Frames frames, Rate rate) {
    Scenario scenario;
    scenario.captures.push_back(std::move(frames));
    scenario.channels.emplace_back();
    scenario.channels.back().rate = rate;
    return scenario;
}

Scenario builtinScenario() {
    Scenario scenario = oneChannel(builtinFrames(), {});
    scenario.channels.back().loop = true;
    return scenario;
}

}  // namespace softboard

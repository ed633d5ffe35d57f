// What the launcher hands over, as the library reads it: a scenario, which then survives another hand-over,
// or an exception.
#include "softboard/scenario.h"
#include "tests/fuzz/fuzz.h"

namespace {

bool read(const std::string& text, softboard::Scenario& into) {
    try {
        into = softboard::fromJson(text);
    } catch (const std::exception&) {
        return false;
    }
    return true;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    softboard::Scenario scenario;
    softboard::Scenario again;
    if (read(std::string(data, data + size), scenario))
        fuzz::require(read(softboard::toJson(scenario), again) && again == scenario,
                      "a scenario is handed over as it is");
    return 0;
}

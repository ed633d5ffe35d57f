// A scenario file: a scenario that the launcher can hand over, or a report that names the file.
#include "softboard/settings.h"
#include "tests/fuzz/file.h"

namespace {

// The captures that it names are files of this machine: none is opened.
void withoutCaptures(softboard::ScenarioFile& file) {
    file.settings.frames.reset();
    for (softboard::ChannelSettings& channel : file.channels)
        channel.settings.frames.reset();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static fuzz::File file;
    file.hold(data, size);
    try {
        softboard::ScenarioFile read = softboard::readScenarioFile(file.path());
        withoutCaptures(read);
        softboard::Scenario scenario = softboard::resolve({}, {}, &read);
        scenario.captures.assign(scenario.captures.size(), {});
        fuzz::require(softboard::fromJson(softboard::toJson(scenario)) == scenario,
                      "a scenario is handed over as it is");
    } catch (const softboard::BadInput& error) {
        fuzz::require(std::string_view(error.what()).starts_with(file.path() + ":"),
                      "a report names the file");
    }
    return 0;
}

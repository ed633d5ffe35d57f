// A capture file: frames in order of their time, none empty, or a report that names the file.
#include "softboard/capture.h"
#include "softboard/settings.h"
#include "tests/fuzz/file.h"

namespace {

void check(const softboard::Frames& frames) {
    fuzz::require(!frames.empty(), "a capture holds frames");
    std::uint32_t ticks = 0;
    for (const softboard::Frame& frame : frames) {
        fuzz::require(!frame.octets.empty(), "a frame has octets");
        fuzz::require(frame.ticks >= ticks, "time does not go back");
        ticks = frame.ticks;
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static fuzz::File file;
    file.hold(data, size);
    try {
        check(softboard::readCapture(file.path()));
    } catch (const softboard::BadInput& error) {
        fuzz::require(std::string_view(error.what()).starts_with(file.path() + ": "),
                      "a report names the file");
    }
    return 0;
}

#include "bench/inputs.h"

#include <algorithm>
#include <filesystem>
#include <utility>
#include <vector>

#include "app/protocol.h"
#include "decoder/cursor.h"
#include "softboard/capture.h"
#include "softboard/settings.h"
#include "tests/decoder/golden_cases.h"

namespace bench {

namespace {

namespace fs = std::filesystem;

// The octets to put before a message or an element to make a frame of it: the header of an information frame,
// and for an element also that of a SETUP.
std::vector<std::uint8_t> headersOf(golden::Kind kind) {
    switch (kind) {
        case golden::Kind::frame:
            return {};
        case golden::Kind::message:
            return {0x02, 0x01, 0x00, 0x00};
        default:
            return {0x02, 0x01, 0x00, 0x00, 0x08, 0x02, 0x00, 0x01, 0x05};
    }
}

void addCase(softboard::Frames& frames, const golden::Case& kase) {
    for (const golden::Octets& octets : kase.octets) {
        softboard::Frame frame;
        frame.transmitted = kase.transmitted;
        frame.ticks = static_cast<std::uint32_t>(frames.size());
        frame.octets = headersOf(kase.kind);
        frame.octets.insert(frame.octets.end(), octets.begin(), octets.end());
        frames.push_back(std::move(frame));
    }
}

void addGolden(softboard::Frames& frames, const fs::path& path, int variant) {
    for (const golden::Case& kase : golden::parse(path, golden::contentsOf(path)).cases) {
        const bool meant = std::any_of(kase.on.begin(), kase.on.end(),
                                       [&](const golden::Trunk& trunk) { return trunk.variant == variant; });
        if (meant)
            addCase(frames, kase);
    }
}

std::vector<fs::path> goldensIn(const fs::path& folder) {
    std::vector<fs::path> found;
    for (const auto& entry : fs::directory_iterator(folder)) {
        if (entry.path().extension() == ".golden")
            found.push_back(entry.path());
    }
    std::sort(found.begin(), found.end());
    return found;
}

}  // namespace

int variantOf(const std::string& protocol) {
    const app::Protocol* const known = app::protocolOf(softboard::parseProtocol(protocol));
    if (known == nullptr)
        throw softboard::BadInput(protocol + ": no protocol that is decoded");
    return known->variant;
}

softboard::Frames readInput(const std::string& path, int variant) {
    softboard::Frames frames;
    const fs::path named(path);
    if (fs::is_directory(named)) {
        for (const fs::path& golden : goldensIn(named))
            addGolden(frames, golden, variant);
    } else if (named.extension() == ".golden") {
        addGolden(frames, named, variant);
    } else {
        frames = softboard::readCapture(path);
    }
    std::erase_if(frames,
                  [](const softboard::Frame& frame) { return frame.octets.size() > decoder::maximumFrame; });
    if (frames.empty())
        throw softboard::BadInput(path + ": nothing for this variant");
    return frames;
}

}  // namespace bench

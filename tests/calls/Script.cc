#include "tests/calls/Script.h"

#include <map>
#include <sstream>
#include <stdexcept>
#include <string>

#include "tests/calls/recorded.h"
#include "tests/isdn/hex.h"

namespace calls::testing {

namespace {

// Control octets of Q.921 table 5, without P/F, and whether the frame is a command.
struct Form {
    std::vector<std::uint8_t> control;
    bool command;
};
const std::map<std::string, Form, std::less<>> forms{
    {"I", {{0x00, 0x00}, true}},    {"RR", {{0x01, 0x00}, false}}, {"RNR", {{0x05, 0x00}, false}},
    {"REJ", {{0x09, 0x00}, false}}, {"SABME", {{0x6F}, true}},     {"DM", {{0x0F}, false}},
    {"UI", {{0x03}, true}},         {"DISC", {{0x43}, true}},      {"UA", {{0x63}, false}},
    {"FRMR", {{0x87}, false}},
};

struct Words {
    unsigned sapi = 0;
    unsigned tei = 0;
    std::string name;
    std::vector<unsigned> numbers;
    bool poll = false, final = false, teiGiven = false;
    std::string information;
};

Words wordsOf(std::istream& line) {
    Words words;
    for (std::string word; line >> word;) {
        if (word == "sapi")
            line >> words.sapi;
        else if (word == "tei") {
            line >> words.tei;
            words.teiGiven = true;
        } else if (word == "P")
            words.poll = true;
        else if (word == "F")
            words.final = true;
        else if (word == "=")
            std::getline(line, words.information);
        else if (words.name.empty())
            words.name = word;
        else
            words.numbers.push_back(static_cast<unsigned>(std::stoul(word)));
    }
    return words;
}

std::vector<std::uint8_t> octetsOf(const Words& words, bool fromNetwork) {
    Form form = forms.at(words.name);
    const bool unnumbered = form.control.size() == 1;
    const bool command = form.command || (words.poll && !unnumbered);
    const unsigned tei = words.name == "UI" && !words.teiGiven ? 127 : words.tei;
    std::vector<std::uint8_t> octets{
        static_cast<std::uint8_t>(words.sapi << 2 | (command == fromNetwork ? 2U : 0U)),
        static_cast<std::uint8_t>(tei << 1 | 1U)};
    const bool pf =
        words.poll || words.final || words.name == "SABME" || words.name == "DISC" || words.name == "UA";
    if (unnumbered) {
        form.control[0] |= pf ? 0x10 : 0;
    } else {
        form.control[1] = static_cast<std::uint8_t>(words.numbers.back() << 1 | (pf ? 1U : 0U));
        if (words.name == "I")
            form.control[0] = static_cast<std::uint8_t>(words.numbers.at(0) << 1);
    }
    octets.insert(octets.end(), form.control.begin(), form.control.end());
    std::vector<std::uint8_t> information = isdn::testing::hex(words.information);
    if (words.name == "I" && information.empty())
        information = {0x08, 0x01, 0x01, 0x7B, 0x2C, 0x01, static_cast<std::uint8_t>(words.numbers.at(0))};
    octets.insert(octets.end(), information.begin(), information.end());
    return octets;
}

const capture::Interface trunk{"trunk"};

}  // namespace

capture::Frame frameOf(const ScriptFrame& scripted) {
    capture::Frame frame = scripted.frame;
    frame.octets = scripted.octets;
    return frame;
}

std::vector<ScriptFrame> script(std::string_view story, bool network) {
    std::vector<ScriptFrame> frames;
    std::istringstream lines{std::string(story)};
    for (std::string text; std::getline(lines, text);) {
        std::istringstream line(text);
        double seconds = 0;
        std::string direction;
        if (!(line >> seconds >> direction))
            continue;
        try {
            ScriptFrame scripted;
            scripted.frame.transmitted = direction == ">";
            scripted.octets = octetsOf(wordsOf(line), scripted.frame.transmitted == network);
            scripted.at = static_cast<std::int64_t>(seconds * 1000 + 0.5) * millisecond;
            scripted.frame.clock = capture::Clock::absolute;
            scripted.frame.time = scripted.at;
            scripted.frame.interface = &trunk;
            frames.push_back(std::move(scripted));
        } catch (const std::exception& error) {
            throw std::runtime_error(text + ": " + error.what());
        }
    }
    return frames;
}

std::vector<ScriptFrame> recordedFrames(std::string_view excerpt) {
    std::vector<ScriptFrame> frames;
    std::istringstream lines{std::string(excerpt)};
    std::uint32_t ticks = 0;
    std::string octets;
    for (bool transmitted = false; lines >> transmitted >> ticks >> octets;) {
        ScriptFrame scripted;
        scripted.octets = isdn::testing::hex(octets);
        scripted.frame.transmitted = transmitted;
        scripted.frame.ticks = ticks;
        scripted.at = ticks * capture::nanosecondsPerTick;
        scripted.frame.clock = capture::Clock::relative;
        scripted.frame.time = scripted.at;
        scripted.frame.interface = &trunk;
        frames.push_back(std::move(scripted));
    }
    return frames;
}

}  // namespace calls::testing

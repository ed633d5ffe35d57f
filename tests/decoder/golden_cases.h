// The golden files of the decoder: what they hold, how they are read, and how a case is run.
// golden/README.md describes the format.
#ifndef TESTS_DECODER_GOLDEN_CASES_H
#define TESTS_DECODER_GOLDEN_CASES_H

#include <array>
#include <ostream>
#include <string>
#include <string_view>
#include <vector>

#include "decoder/cursor.h"

namespace golden {

using Octets = std::vector<unsigned char>;
using ElementDecoder = void (*)(unsigned char id, decoder::RingBuffer* rb);

struct Trunk {
    std::string_view name;
    int variant;  // what `swit` holds
};

// How a test that runs on each trunk names it.
inline void PrintTo(const Trunk& trunk, std::ostream* out) { *out << trunk.name; }

// `other` stands for every variant that no decoder knows.
inline constexpr std::array<Trunk, 7> trunks{{
    {"att4ess", 1},
    {"5ess", 2},
    {"dms100", 3},
    {"ntt", 4},
    {"net5", 7},
    {"ni2", 10},
    {"other", 5},
}};

// What the octets are, and so which function decodes them.
enum class Kind {
    element,  // one element, through ie_id
    direct,   // one element, through the decoder that is named
    message,  // from the protocol discriminator on, through layer_3
    frame,    // a whole frame, through parse_isdn_frame
};

struct Case {
    int line = 0;  // of its sentence in the file
    std::string sentence;
    std::vector<Trunk> on;
    Kind kind = Kind::element;
    ElementDecoder directDecoder = nullptr;
    bool transmitted = false;
    std::vector<Octets> octets;  // several only for frames: one after another
    int left = 0;                // octets that stay in the cursor
    std::string expected;
    std::size_t textBegin = 0, textEnd = 0;  // the lines of the file that hold the expected text
};

struct File {
    std::string path;
    std::vector<std::string> lines;
    std::vector<Case> cases;
};

// All of a file; throws std::runtime_error when it cannot be read.
std::string contentsOf(const std::string& path);

// Names of all golden files, sorted.
std::vector<std::string> names();

// Both throw std::runtime_error saying file, line and reason.
File read(const std::string& name);
File parse(const std::string& path, std::string_view contents);

// The lines of a file that stand for a text, and the text that they stand for. unescape throws
// std::runtime_error.
std::vector<std::string> escape(std::string_view text);
std::string unescape(const std::vector<std::string>& lines);

// Puts a text in place of the case's own in file.lines; cases after it are not moved.
void replaceText(File& file, const Case& kase, std::string_view text);

// The state after the octets are decoded.
struct Outcome {
    std::string text;
    int left = 0;  // octets in the cursor
    int flag = 0;
    int swit = 0;
};

// Decodes the case's octets on one trunk.
Outcome run(const Case& kase, const Trunk& trunk);

// A few lines that show where two texts differ, escaped as in the file.
std::string difference(std::string_view expected, std::string_view actual);

}  // namespace golden

#endif

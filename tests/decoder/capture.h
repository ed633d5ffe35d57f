// Runs the decoder and gives back what it wrote to the log.
#ifndef TESTS_DECODER_CAPTURE_H
#define TESTS_DECODER_CAPTURE_H

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "decoder/cursor.h"
#include "decoder/frame.h"
#include "decoder/layer3.h"
#include "decoder/lines.h"
#include "decoder/state.h"

namespace decoder::testing {

// The values of `swit`.
inline constexpr int noTrunk = 0;
inline constexpr int on4ess = 1;
inline constexpr int on5ess = 2;
inline constexpr int onDms100 = 3;
inline constexpr int onNtt = 4;
inline constexpr int onNet5 = 7;
inline constexpr int onNi2 = 10;

// The indent of a transmitted frame's lines.
inline const std::string blanks(33, ' ');

// For its lifetime the decoder logs into memory; afterwards its words are as they were at the start of the
// program.
class Capture {
  public:
    explicit Capture(int trunk = 0, int indentation = 1) {
        log_ = open_memstream(&data_, &size_);
        ofp = log_;
        file_output = true;
        swit = trunk;
        flag = indentation;
    }
    ~Capture() {
        flushLines();
        ofp = nullptr;
        file_output = false;
        swit = flag = msglen = ielength = bit_field = 0;
        (void)std::fclose(log_);
        std::free(data_);  // NOLINT(*-no-malloc): the C library's own
    }
    Capture(const Capture&) = delete;
    Capture& operator=(const Capture&) = delete;

    // What the log holds so far, lines not yet handed over included.
    std::string text() {
        flushLines();
        (void)std::fflush(log_);
        return {data_, size_};
    }

  private:
    char* data_ = nullptr;
    std::size_t size_ = 0;
    std::FILE* log_ = nullptr;
};

inline vela::staticList<unsigned char> listOf(const std::vector<unsigned char>& octets) {
    vela::staticList<unsigned char> list(static_cast<unsigned>(octets.size()));
    std::copy(octets.begin(), octets.end(), list.begin());
    return list;
}

inline RingBuffer cursorOver(const std::vector<unsigned char>& octets) {
    RingBuffer rb;
    vela::staticList<unsigned char> list = listOf(octets);
    getBlock(&rb, list, static_cast<int>(octets.size()));
    return rb;
}

// A whole frame, as the trace application decodes it: its lines and its dump.
inline std::string decoded(const std::vector<unsigned char>& octets, int trunk, int indentation) {
    Capture log(trunk, indentation);
    msglen = static_cast<int>(octets.size());
    vela::staticList<unsigned char> list = listOf(octets);
    RingBuffer rb;
    if (getBlock(&rb, list, msglen))
        parse_isdn_frame(rb);
    return log.text();
}

// One part of the decoder, for instance layer_2, on these octets.
template <typename Part>
std::string decodedBy(Part part, const std::vector<unsigned char>& octets, int trunk = 0,
                      int indentation = 1) {
    RingBuffer rb = cursorOver(octets);
    Capture log(trunk, indentation);
    part(&rb);
    return log.text();
}

// The element at the start of these octets, the indent of its first line included.
inline std::string element(const std::vector<unsigned char>& octets, int trunk, int indentation = 1) {
    return decodedBy(ie_id, octets, trunk, indentation);
}

}  // namespace decoder::testing

#endif

// Reads the frames that the benches decode.
#ifndef BENCH_INPUTS_H
#define BENCH_INPUTS_H

#include <string>

#include "softboard/scenario.h"

namespace bench {

// The value of `swit` for a protocol of the software board, by name or number ("net5", "12"). Throws
// softboard::BadInput for a protocol that lapdmon refuses.
int variantOf(const std::string& protocol);

// Reads a capture, a golden file of the decoder, or a folder of golden files. Of golden files it takes the
// cases for the variant, and puts an element or a message without a frame into one. It leaves out frames that
// are too long to be decoded. Throws softboard::BadInput, also when no frame is left, and std::runtime_error
// for a golden file that cannot be read.
softboard::Frames readInput(const std::string& path, int variant);

}  // namespace bench

#endif

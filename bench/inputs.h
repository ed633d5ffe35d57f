// The frames that the benches work on.
#ifndef BENCH_INPUTS_H
#define BENCH_INPUTS_H

#include <string>

#include "softboard/scenario.h"

namespace bench {

// The value of `swit` for a trunk of the software board's name or number ("net5", "12"). Throws
// softboard::BadInput for a type that the program would refuse.
int variantOf(const std::string& protocol);

// A capture, a golden file of the decoder, or a folder of them, of which those cases are taken that are meant
// for the variant; an element or a message alone is put into a frame. Without the frames that are too long to
// be decoded, of which the program tells the screen. Throws softboard::BadInput, also when nothing is left,
// or std::runtime_error for a golden file that cannot be read.
softboard::Frames readInput(const std::string& path, int variant);

}  // namespace bench

#endif

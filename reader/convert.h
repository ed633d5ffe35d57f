// Frames in files that other tools read.
#ifndef READER_CONVERT_H
#define READER_CONVERT_H

#include "reader/Options.h"

namespace CLI {
class App;
}

namespace reader {

void declareConvert(CLI::App& app, Options& options);
int runConvert(const Options& options, Chatter& chatter);

}  // namespace reader

#endif

// Makes the files from which shells know what to offer when Tab is pressed.
#ifndef MANUAL_COMPLETION_H
#define MANUAL_COMPLETION_H

#include <string>

#include "manual/Program.h"

namespace manual {

// A file that bash (or bash-completion) reads.
std::string bashCompletion(const Program& program);

// A file of zsh's function path, named _PROGRAM.
std::string zshCompletion(const Program& program);

}  // namespace manual

#endif

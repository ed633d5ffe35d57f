// The inputs that the options name, as one stream.
#ifndef READER_INPUTS_H
#define READER_INPUTS_H

#include <memory>
#include <string>
#include <vector>

#include "capture/Reader.h"
#include "reader/Chatter.h"
#include "reader/Options.h"

namespace reader {

// Their names; the standard input alone ("-") if none is given and it is no terminal. Throws UsageError if
// there is nothing to read.
std::vector<std::string> inputFiles(const Options& options);

// One input of any form that this program reads.
std::unique_ptr<capture::Reader> openFile(const std::string& file, const InputOptions& input);

// One after another, or by time with --merge. Throws FileError for one that cannot be opened or is of no
// known form, before anything is read.
std::unique_ptr<capture::Reader> openInputs(const Options& options, Chatter& chatter);

// Throws capture::BadInput for a regular file among them that is of no known form. Inputs that are followed
// may be empty as yet, and are not looked at; nor are pipes, which can be read only once.
void checkForms(const Options& options);

}  // namespace reader

#endif

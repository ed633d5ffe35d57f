// Opens the inputs that the options name, as one stream.
#ifndef READER_INPUTS_H
#define READER_INPUTS_H

#include <memory>
#include <string>
#include <vector>

#include "capture/Reader.h"
#include "reader/Chatter.h"
#include "reader/Options.h"
#include "reader/Primed.h"

namespace reader {

// The names of the inputs; none if a store is read instead. If none is given, that is only "-", the standard
// input. Throws UsageError if none is given and the standard input is a terminal.
std::vector<std::string> inputFiles(const Options& options);

// What is read, for people: the names of the inputs, or "the store", with the sites and D channels that were
// chosen there. Its URL may hold a password, and is left out.
std::vector<std::string> inputNames(const Options& options);

// Whether frames of more than one D channel are to be expected, from a store, or from files whose names say
// so. A line of text then names its D channel.
bool mayHaveSeveralDChannels(const Options& options);

// Opens an input. Throws capture::BadInput if it cannot be opened; next() throws that for an unknown form.
std::unique_ptr<capture::Reader> openFile(const std::string& file, const InputOptions& input);

// Opens all inputs as one stream: one after another, or in the order of time with --merge. The D channels of
// a store come in the order of time. Throws FileError or capture::BadInput, before anything is read, if one
// cannot be opened or its form is not known.
//
// If `pipes` is given, opens all inputs that can be read only once now, and adds a pointer to each to
// `pipes`. The returned stream owns them. The caller may wait for the first item of each before it reads the
// stream. An input that is named twice is opened, and added, once.
std::unique_ptr<capture::Reader> openInputs(const Options& options, Chatter& chatter,
                                            std::vector<Primed*>* pipes = nullptr);

// Sets the options that the chosen D channels of a store decide: those that share their calls do so as if
// --nfas named them. Notes which of them cannot be asked for the numbers that --number has. Without a store
// nothing is done. Throws what openInputs() throws for a store.
void learnTrunksOfStore(Options& options, Chatter& chatter);

// Throws capture::BadInput if one of the inputs is a regular file whose form is not known. Does not look at
// inputs that are followed, because they may be empty yet, nor at pipes, because they can be read only once.
void checkForms(const Options& options);

// Whether the input is a regular file, and so can be read a second time.
bool canBeReadAgain(const std::string& file);

}  // namespace reader

#endif

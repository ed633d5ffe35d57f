// Writes frames that were marked into a file.
#ifndef READER_BROWSE_SAVING_H
#define READER_BROWSE_SAVING_H

#include <string>

#include "reader/Options.h"
#include "reader/browse/Screen.h"
#include "redaction/Key.h"

namespace reader::browse {

// Writes the frames of `order` that the store still has to a pcapng file, in the order of the input. `order`
// must name at least one frame. Overwrites a file. Redaction looks at all kept frames before them as well,
// because a number may have begun there. Returns a sentence that says what was done. Throws FileError.
// Another thread than the one that fills the store may call this with a copy of the store.
std::string saveFrames(const FrameStore& frames, const SaveOrder& order, const Options& options,
                       const redaction::Key& key);

}  // namespace reader::browse

#endif

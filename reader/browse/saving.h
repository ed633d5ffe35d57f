// Writes frames that were marked into a file.
#ifndef READER_BROWSE_SAVING_H
#define READER_BROWSE_SAVING_H

#include <string>

#include "reader/Options.h"
#include "reader/browse/Screen.h"
#include "redaction/Key.h"

namespace reader::browse {

// `order` must name a frame. Writes pcapng; over a file that is there. The frames that are still in the store
// are written, in their order. Redaction looks at all frames before them, since numbers may have begun there.
// Returns what was done, in words. Throws FileError. May be called on another thread than the one that fills
// the store, with a copy of it.
std::string saveFrames(const FrameStore& frames, const SaveOrder& order, const Options& options,
                       const redaction::Key& key);

}  // namespace reader::browse

#endif
